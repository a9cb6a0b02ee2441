#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Builds a plug-in and a front end with the headers recorded in packaging/abi/ (scripts/abi --record) and runs them with the
# library, the plug-ins and the zep of today.
#
#   baseline-test.sh SOURCE_DIR PACKAGED_BUILD_DIR CXX
set -euo pipefail
export LC_ALL=C
source=$1 build=$2 cxx=$3
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT
fail() { echo "$1:" >&2; cat "$work/log" >&2; exit 1; }

cd "$work"
tar -xJf "$source/packaging/abi/libzepcore.so.1.kit.tar.xz"
flags=(-std=c++17 -fPIC -DBOOST_ENABLE_ASSERT_HANDLER -Iinclude -Iproviders/memory)
libraries=(-L"$build/lib" -lzepcore -Wl,-rpath,"$build/lib")
"$cxx" "${flags[@]}" examples/ListProvider.cpp -o list-provider "${libraries[@]}"
{ printf '#include "%s"\n' providers/memory/*.cpp examples/Clock/Clock.cpp; } >plug-in.cpp  # parses the headers once
"$cxx" "${flags[@]}" -I. -shared -fvisibility=hidden -Wl,--version-script="$source/cmake/ZepProvider.map" plug-in.cpp -o libClock.nsp.so "${libraries[@]}"

./list-provider "$work/libClock.nsp.so" >log 2>&1 || fail "the recorded front end and plug-in do not work together"
grep -q 'X_Clock' log || fail "the recorded front end does not list the clock"
ZEP_SMBIOS_TABLE=$source/tools/zep/sample/smbios.bin ./list-provider "$build/lib/libHost.nsp.so" >log 2>&1 ||
  fail "the recorded front end does not work with the host provider of today"
grep -q 'SerialNumber = KQ12345' log || fail "the recorded front end does not read the host provider of today"
"$build/bin/zep" show X_Clock --plugin "$work/libClock.nsp.so" >log 2>&1 || fail "zep does not work with the recorded plug-in"
grep -q '^root/clock:X_Clock' log || fail "zep does not list the object of the recorded plug-in"
