#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Installs the build tree given into a fresh prefix, lets the zep there write the project of a plug-in, and does what its README
# says: builds it without a warning, runs its test, installs it, and looks at its objects.
#
#   new-plugin-test.sh BUILD_DIR CXX
set -euo pipefail
export LC_ALL=C
unset ZEP_DMTF_SCHEMA
build=$1 cxx=$2
here=$(cd "$(dirname "$0")" && pwd)
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT
cmake --install "$build" --prefix "$work/prefix" >"$work/install.log"
zep=$work/prefix/bin/zep

fail() {  # fail REASON [FILE]
  echo "$1" >&2
  [[ $# == 1 ]] || cat "$2" >&2
  exit 1
}

cd "$work"
"$zep" plugin new Everything --class x_everything --mof "$here/everything.mof" >"$work/new.log" || fail "zep plugin new failed"
cmake -G Ninja -S Everything -B project -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$work/prefix" \
  -DCMAKE_CXX_FLAGS="-Wall -Wextra -Wpedantic -Wshadow -Werror" >"$work/log" || fail "it is not configured:" "$work/log"
cmake --build project >"$work/log" || fail "it is not built:" "$work/log"
ctest --test-dir project --output-on-failure >"$work/log" || fail "its test fails:" "$work/log"
grep -q '100% tests passed, 0 tests failed out of 1' "$work/log" || fail "it has no test:" "$work/log"

plugin=project/libEverything.nsp.so
nm --dynamic --defined-only "$plugin" >"$work/log"
[[ ! -s $work/log ]] || fail "the plug-in exports symbols:" "$work/log"
readelf --wide --dynamic "$plugin" | grep -q 'Library runpath: \[\$ORIGIN\]' || fail "the plug-in does not find libzepcore.so beside it"

"$zep" plugin check "$plugin" --mof "$here/everything.mof" >"$work/log" 2>&1 || fail "zep plugin check finds faults:" "$work/log"
grep -q '^schema  *passed' "$work/log" || fail "its classes are not checked against the schema:" "$work/log"

cmake --install project >"$work/log" || fail "it is not installed:" "$work/log"
document=$work/prefix/share/zepcore/mof/Everything.mof
"$zep" plugin check "$(dirname "$(find "$work/prefix" -name libzepcore.so)")/libEverything.nsp.so" --mof "$document" >"$work/log" 2>&1 ||
  fail "the companion document does not describe the installed plug-in:" "$work/log"
grep -q '^schema  *passed' "$work/log" || fail "the companion document is not read:" "$work/log"
"$zep" report --sample >"$work/log" || true  # an incomplete report is not a failure here
grep -q 'Everything .*root/everything' "$work/log" || fail "zep report does not list the plug-in:" "$work/log"
"$zep" show X_Everything >"$work/log" || fail "zep show does not find the class:" "$work/log"
grep -q '^root/everything:X_Everything\..*CreationClassName="X_Everything"' "$work/log" || fail "zep show lists no object:" "$work/log"

# A key that the author forgets makes the test of the project fail.
sed -i 's/values.Set("Number", 1);/values.Set("Number", TCIMValue());/' Everything/Everything.cpp
cmake --build project >"$work/log" || fail "it is not built:" "$work/log"
! ctest --test-dir project --output-on-failure >"$work/log" || fail "its test passes without a key"
grep -q 'the key Number is NULL' "$work/log" || fail "its test does not name the key:" "$work/log"

# A change of the MOF file reaches the plug-in.
sed -i 's/values.Set("Number", TCIMValue());/values.Set("Number", 1);/; s/values.Set("U8", TCIMValue());/values.Set("U9", 9);/' Everything/Everything.cpp
sed -i 's/uint8 U8;/uint8 U9;/' Everything/Everything.mof
cmake --build project >"$work/log" || fail "it is not built:" "$work/log"
ctest --test-dir project --output-on-failure >"$work/log" || fail "its test fails after a change of the MOF file:" "$work/log"

# The kit carries a part of the schema of the DMTF, with its notice, if the build has found that schema.
schema=$work/prefix/share/zepcore/schema
reduced=$(find "$schema" -name 'cim_schema_*-reduced.mof' 2>/dev/null || true)
if [[ -n $reduced ]]; then
  grep -q 'provided that correct attribution is given' "$reduced" || fail "the schema has lost its notice" "$reduced"
  [[ $(stat -c %s "$reduced") -lt 3000000 ]] || fail "the schema is not small"
  "$zep" plugin new Fan --class CIM_Fan >"$work/log" 2>&1 || fail "CIM_Fan is not found:" "$work/log"
  cmake -G Ninja -S Fan -B fan -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$work/prefix" >"$work/log" || fail "it is not configured:" "$work/log"
  cmake --build fan >"$work/log" || fail "it is not built:" "$work/log"
  ctest --test-dir fan --output-on-failure >"$work/log" || fail "its test fails:" "$work/log"
  grep -q 'Reproduced with attribution' Fan/Fan.mof || fail "Fan.mof has no attribution" Fan/Fan.mof
  "$zep" plugin check fan/libFan.nsp.so >"$work/log" 2>&1 || fail "zep plugin check finds faults:" "$work/log"
  grep -q '^schema  *passed' "$work/log" || fail "it is not checked against the schema of the kit:" "$work/log"

  # --mof and ZEP_DMTF_SCHEMA come before it.
  "$zep" plugin new ByMof --class X_Everything --mof "$here/everything.mof" >"$work/log" 2>&1 || fail "--mof does not count:" "$work/log"
  ZEP_DMTF_SCHEMA=$here/everything.mof "$zep" plugin new ByVariable --class X_Everything >"$work/log" 2>&1 ||
    fail "ZEP_DMTF_SCHEMA does not count:" "$work/log"
  rm -r "$schema"
else
  [[ ${CI:-} != true ]] || fail "the build has not found the schema of the DMTF (ZEP_DMTF_SCHEMA)"
  echo "the build has not found the schema of the DMTF: it is not tested"
fi
! "$zep" plugin new Lost --class CIM_Fan >"$work/log" 2>&1 || fail "a class without a schema is found"
grep -q '^zep: there is no schema; name a MOF file with --mof, or ' "$work/log" || fail "the remedy is missing:" "$work/log"
echo "the project of a new plug-in works"
