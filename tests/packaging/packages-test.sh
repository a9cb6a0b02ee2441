#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Examines the Debian packages in a directory. lintian must report nothing about them, and manual pages must be the help texts. zep
# must run without libzepcore-dev. Then the test unpacks libzepcore-dev with all packages of ours that it depends on, and makes a
# plug-in with nothing else: new, build, and its class in the report. A plug-in of the build tree must be loaded, too.
#
#   packages-test.sh PACKAGES_DIR BUILD_DIR CXX
set -euo pipefail
export LC_ALL=C
packages=$1 build=$2 cxx=$3
here=$(cd "$(dirname "$0")" && pwd)
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT

fail() {  # fail REASON [FILE]
  echo "$1" >&2
  [[ $# == 1 ]] || cat "$2" >&2
  exit 1
}

# Each provider is in its own package; the one that links code under the GPL is in libzepcore-ipmi, which states that.
holds() { dpkg-deb --contents "$packages/$1"_*.deb | grep "/zepcore/$2\$" >/dev/null || fail "$2 is not in $1"; }
for name in Host Storage Network Devices Sensors; do holds "zep-provider-${name,,}" "lib$name.nsp.so"; done
holds libzepcore1 "libzepcore\.so\.1\.[0-9.]*"
holds libzepcore1 "libzepcore\.so\.1 -> libzepcore\.so\.1\.[0-9.]*"
holds libzepcore-dev "libzepcore\.so -> libzepcore\.so\.1"
holds zep libzep-packing.so
for name in libarchive13 libssl3; do  # loaded through it
  dpkg-deb --field "$packages"/zep_*.deb Depends | grep -q "$name" || fail "zep does not depend on $name"
done
holds libzepcore-ipmi libController.nsp.so
dpkg-deb --fsys-tarfile "$packages"/libzepcore-ipmi_*.deb | tar -xO ./usr/share/doc/libzepcore-ipmi/copyright >"$work/log"
grep -q '^License: GPL-3.0-or-later$' "$work/log" || fail "libzepcore-ipmi does not state its licence:" "$work/log"

# The address of the maintainer is that of the person who makes the packages (ZEP_PACKAGE_CONTACT).
# The debug packages of the providers have only the names of functions, unless they are made with scripts/package --debug.
if command -v lintian >/dev/null; then
  lintian --allow-root --suppress-tags bogus-mail-host,bogus-mail-host-in-debian-changelog,debug-file-with-no-debug-symbols \
    "$packages"/*.deb "$packages"/debug/*.deb >"$work/log" 2>&1 ||
    fail "lintian fails:" "$work/log"
  [[ ! -s $work/log ]] || fail "lintian reports:" "$work/log"
else
  [[ ${CI:-} != true ]] || fail "lintian is not installed"
  echo "lintian is not installed: the packages are not checked"
fi

# The debug information is found by the build identification of a library, and no package names the directory of the build.
for file in "$packages"/*.deb "$packages"/debug/*.deb; do dpkg-deb --extract "$file" "$work/all"; done
id=$(readelf --notes "$work"/all/usr/lib/*/zepcore/libzepcore.so.1 | sed -n 's/.*Build ID: //p')
debug=$work/all/usr/lib/debug/.build-id/${id:0:2}/${id:2}.debug
readelf --debug-dump=info --dwarf-depth=1 "$debug" 2>/dev/null | grep 'DW_AT_name.*cim/value/TCIMValue.cpp' >/dev/null ||
  fail "libzepcore1-dbgsym has no debug information of libzepcore.so.1"
! grep -rlF "$(dirname "$(dirname "$packages")")" "$work/all" >"$work/log" || fail "files name the directory of the build:" "$work/log"
date=$(gzip -dc "$work/all/usr/share/doc/zep/changelog.gz" | sed -n 's/^ -- .*>  //p')
[[ $(stat --format=%Y "$work/all/usr/bin/zep") == $(date --date="$date" +%s) ]] || fail "the time of the files is not that of the changelog"
rm -r "$work/all"

# Unpacks the package and those of ours that it depends on.
unpack() {  # unpack NAME
  local file depends
  file=$(ls "$packages/$1"_*.deb 2>/dev/null) || return 0
  [[ ! -e $work/unpacked/$1 ]] || return 0
  mkdir -p "$work/unpacked/$1"
  dpkg-deb --extract "$file" "$work/root"
  depends=$(dpkg-deb --field "$file" Depends | sed 's/([^)]*)//g; s/[|,]/ /g')
  for name in $depends; do unpack "$name"; done
}
soname_of() { readelf --wide --dynamic "$1" | sed -n 's/.*Library soname: \[\(.*\)\]/\1/p'; }

# Without libzepcore-dev: the library has only its versioned names, and finds the plug-ins beside it.
unpack zep
libraries=$(dirname "$(find "$work/root" -name libzepcore.so.1)")
[[ $(soname_of "$libraries/libzepcore.so.1") == libzepcore.so.1 ]] || fail "the SONAME of the packaged library is wrong"
[[ ! -e $libraries/libzepcore.so ]] || fail "zep depends on the link libzepcore.so"
"$work/root/usr/bin/zep" report --sample >"$work/log" || true  # an incomplete report is not a failure here
grep -q 'Host .*root/' "$work/log" || fail "zep does not list its provider without libzepcore-dev:" "$work/log"

# The library of a build tree is one file, which works under its name alone.
[[ ! -L $build/lib/libzepcore.so && $(soname_of "$build/lib/libzepcore.so") == libzepcore.so ]] ||
  fail "libzepcore.so of the build tree cannot be copied alone"

unpack libzepcore-dev
zep=$work/root/usr/bin/zep
[[ -x $zep ]] || fail "libzepcore-dev does not bring zep"

# The text of a manual page, below its heading, is that of the help.
help_of_page() { gzip -dc "$work/root/usr/share/man/man1/$1.1.gz" | sed -n '/^\.nf$/,/^\.fi$/p' | sed '1d;$d; s/^\\&//; s/\\-/-/g; s/\\e/\\/g'; }
for command in "" report "plugin new"; do
  read -ra words <<<"$command"
  diff <("$zep" help "${words[@]}" | tail -n +2) <(help_of_page "zep${command:+-${command// /-}}") >"$work/log" ||
    fail "the manual page of zep $command differs from its help:" "$work/log"
done

# The pages about the settings and the library are the sections of the documents.
page_of() { gzip -dc "$work/root/usr/share/man/$1.gz" | man --warnings -E UTF-8 -l -Tascii -P cat - 2>&1 | col -bx; }
page_of man5/zep.cfg.5 >"$work/log"
grep -q 'finding-disk-used-' "$work/log" || fail "zep.cfg(5) has no thresholds:" "$work/log"
! grep 'warning' "$work/log" || fail "zep.cfg(5) is not well formed"
page_of man7/libzepcore.7 >"$work/log"
grep -q 'kZEPStatusNotFound' "$work/log" || fail "libzepcore(7) does not describe the errors:" "$work/log"
! grep 'warning' "$work/log" || fail "libzepcore(7) is not well formed"

for file in bash-completion/completions/zep fish/vendor_completions.d/zep.fish zsh/vendor-completions/_zep; do
  grep -q 'Completion of zep' "$work/root/usr/share/$file" || fail "$file does not complete the command line of zep"
done

cd "$work"
"$zep" plugin new Everything --class X_Everything --mof "$here/everything.mof" >"$work/log" || fail "zep plugin new failed"
cmake -G Ninja -S Everything -B project -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$work/root/usr" >"$work/log" ||
  fail "it is not configured:" "$work/log"
cmake --build project >"$work/log" || fail "it is not built:" "$work/log"
export ZEP_SMBIOS_TABLE=$work/root/usr/share/zepcore/sample/smbios.bin
"$zep" report --section other --plugin project/libEverything.nsp.so >"$work/log" || true  # an incomplete report is not a failure here
grep -q 'X_Everything .*root/everything' "$work/log" || fail "the class is not in the report:" "$work/log"

# A plug-in that was linked in a build tree needs libzepcore.so; the link leads it to the library that is loaded already.
cp "$build/examples/libClock.nsp.so" "$libraries/"
"$zep" report --sample >"$work/log" || true
grep -q 'Clock .*root/clock' "$work/log" || fail "a plug-in of the build tree is not loaded:" "$work/log"

# A program that opens the library by its path: it is the library that a program linked against it has loaded.
read -ra flags <<<"$(PKG_CONFIG_PATH=$(dirname "$libraries")/pkgconfig pkg-config --cflags --libs zepcore)"
"$cxx" -std=c++17 "$here/opens-library.cpp" -o "$work/opens-library" "${flags[@]}"
"$work/opens-library" "$libraries/libzepcore.so" >"$work/log" 2>&1 || fail "the library is loaded twice:" "$work/log"
echo "the packages work, and a plug-in needs libzepcore-dev alone"
