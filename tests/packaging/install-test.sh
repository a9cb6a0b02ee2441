#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Installs the build tree given into a fresh prefix and uses it there as a stranger would: runs zep, and builds the consumer
# with CMake and with pkg-config, and a provider plug-in with CMake.
#
#   install-test.sh BUILD_DIR CXX
set -euo pipefail
build=$1 cxx=$2
here=$(cd "$(dirname "$0")" && pwd)
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT
cmake --install "$build" --prefix "$work/prefix" >"$work/install.log"

private=$(dirname "$(find "$work/prefix" -name libzepcore.so)")
for file in libzep-packing.so libsmbios.so libipmiClient.so ovdusblan.so libHost.nsp.so libNetwork.nsp.so libStorage.nsp.so libDevices.nsp.so libSensors.nsp.so libController.nsp.so; do
  [[ -e $private/$file ]] || { echo "$file does not lie beside libzepcore.so" >&2; exit 1; }
done

status=0
"$work/prefix/bin/zep" report --sample >"$work/report" || status=$?
[[ $status == 0 || $status == 2 ]] || { echo "the installed zep ended with $status" >&2; exit 1; }
grep -q SAMPLE "$work/report"

diff -r "$here/../../docs/schema" "$work/prefix/share/zepcore/json-schema"

expected=$(printf '%s\nQRVSG_ComputerSystem\nkZEPStatusFail\nkZEPStatusNotFound: Failed to find nsp named Nothing' "$private")
check() {  # check NAME PROGRAM
  local printed
  printed=$("$2" 2>/dev/null)
  printed=$(realpath "${printed%%$'\n'*}")$'\n'${printed#*$'\n'}  # pkg-config leads there from the place of its file, by ".."
  [[ $printed == "$expected" ]] || { printf '%s printed:\n%s\ninstead of:\n%s\n' "$1" "$printed" "$expected" >&2; exit 1; }
}

cmake -G Ninja -S "$here/consumer" -B "$work/cmake" -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$work/prefix" >"$work/cmake.log"
cmake --build "$work/cmake" >>"$work/cmake.log" || { cat "$work/cmake.log" >&2; exit 1; }
check "the consumer built with CMake" "$work/cmake/consumer"
ZEP_SMBIOS_TABLE=$work/prefix/share/zepcore/sample/smbios.bin "$work/cmake/report" >"$work/report"
grep -qx 'Serial number: KQ12345' "$work/report" || { echo "the front end that uses collect printed:" >&2; cat "$work/report" >&2; exit 1; }

export PKG_CONFIG_PATH
PKG_CONFIG_PATH=$(dirname "$(find "$work/prefix" -name zepcore.pc)")
read -ra flags <<<"$(pkg-config --cflags --libs zepcore)"
"$cxx" -std=c++17 "$here/consumer/main.cpp" -o "$work/consumer" "${flags[@]}"
check "the consumer built with pkg-config" "$work/consumer"

# A provider plug-in without CMake, by each compiler.
for compiler in "$cxx" clang++; do
  command -v "$compiler" >/dev/null || { echo "$compiler is not installed: it builds no plug-in"; continue; }
  read -ra flags <<<"$(pkg-config --cflags --libs zepcore-memory)"
  "$compiler" -std=c++17 -fPIC -shared -fvisibility=hidden "$here/../../examples/Clock/Clock.cpp" -o "$work/libPlain.nsp.so" "${flags[@]}" \
    -Wl,--version-script="$(pkg-config --variable=pluginmap zepcore-memory)"
  [[ -z $(nm --dynamic --defined-only "$work/libPlain.nsp.so") ]] || { echo "the plug-in built with $compiler exports symbols" >&2; exit 1; }
  "$work/prefix/bin/zep" classes --plugin "$work/libPlain.nsp.so" >"$work/report" 2>&1 || true  # other plug-ins may fail
  grep -q '^X_Clock ' "$work/report" || { echo "the plug-in built with $compiler and pkg-config is not loaded:" >&2; cat "$work/report" >&2; exit 1; }
done
[[ $(realpath "$(pkg-config --variable=plugindir zepcore)") == "$private" ]] || { echo "plugindir is wrong" >&2; exit 1; }

# A provider plug-in of somebody else's, as docs/writing-a-provider.md builds it, and one that states reasons.
cmake -G Ninja -S "$here/../../examples/Clock" -B "$work/clock" -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$work/prefix" >"$work/clock.log"
cmake --build "$work/clock" >>"$work/clock.log" || { cat "$work/clock.log" >&2; exit 1; }
cp "$work/clock/libClock.nsp.so" "$private/"
"$work/prefix/bin/zep" report --sample >"$work/report" || true  # an incomplete report is not a failure here
grep -q 'Clock .*root/clock' "$work/report" || { echo "zep does not list the clock plug-in:" >&2; cat "$work/report" >&2; exit 1; }

cmake -G Ninja -S "$here/../../examples/Batteries" -B "$work/batteries" -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$work/prefix" >"$work/batteries.log"
cmake --build "$work/batteries" >>"$work/batteries.log" || { cat "$work/batteries.log" >&2; exit 1; }
cp "$work/batteries/libBatteries.nsp.so" "$private/"
EXAMPLE_BATTERIES="$work/none" "$work/prefix/bin/zep" report --sample --json >"$work/report" || true
grep -q 'root/batteries' "$work/report" || { echo "zep does not list the batteries plug-in:" >&2; cat "$work/report" >&2; exit 1; }
echo "the installed tree works"
