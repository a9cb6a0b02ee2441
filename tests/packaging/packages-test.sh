#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Makes the Debian packages of the build tree given, unpacks libzepcore-dev with all packages of ours that it depends on, and
# makes a plug-in with nothing else: new, build, and its class in the report.
#
#   packages-test.sh BUILD_DIR CXX
set -euo pipefail
export LC_ALL=C
build=$1 cxx=$2
here=$(cd "$(dirname "$0")" && pwd)
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT

fail() {  # fail REASON [FILE]
  echo "$1" >&2
  [[ $# == 1 ]] || cat "$2" >&2
  exit 1
}

cpack --config "$build/CPackConfig.cmake" -B "$work/packages" >"$work/log" 2>&1 || fail "the packages are not made:" "$work/log"

# Unpacks the package and those of ours that it depends on.
unpack() {  # unpack NAME
  local file depends
  file=$(ls "$work/packages/$1"_*.deb 2>/dev/null) || return 0
  [[ ! -e $work/unpacked/$1 ]] || return 0
  mkdir -p "$work/unpacked/$1"
  dpkg-deb --extract "$file" "$work/root"
  depends=$(dpkg-deb --field "$file" Depends | sed 's/([^)]*)//g; s/[|,]/ /g')
  for name in $depends; do unpack "$name"; done
}
unpack libzepcore-dev
zep=$work/root/usr/bin/zep
[[ -x $zep ]] || fail "libzepcore-dev does not bring zep"

cd "$work"
"$zep" plugin new Everything --class X_Everything --mof "$here/everything.mof" >"$work/log" || fail "zep plugin new failed"
cmake -G Ninja -S Everything -B project -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$work/root/usr" >"$work/log" ||
  fail "it is not configured:" "$work/log"
cmake --build project >"$work/log" || fail "it is not built:" "$work/log"
export ZEP_SMBIOS_TABLE=$work/root/usr/share/zepcore/sample/smbios.bin
"$zep" report --section other --plugin project/libEverything.nsp.so >"$work/log" || true  # an incomplete report is not a failure here
grep -q 'X_Everything .*root/everything' "$work/log" || fail "the class is not in the report:" "$work/log"
echo "a plug-in needs libzepcore-dev alone"
