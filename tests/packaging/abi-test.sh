#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Compares the binary interface of the packaged library with the recorded one, and verifies that the comparison finds a lost
# function, a class of another size and virtual operations in another order, but passes over a new function.
#
#   abi-test.sh SOURCE_DIR LIBRARY
set -euo pipefail
export LC_ALL=C
source=$1 library=$2
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT

if ! command -v abidiff >/dev/null; then
  [[ ${CI:-} != true ]] || { echo "the package abigail-tools is not installed" >&2; exit 1; }
  echo "the package abigail-tools is not installed"
  exit 77
fi

"$source/scripts/abi" "$library"

# finds WHAT TEXT SED_COMMAND: changes the recorded interface and compares it.
finds() {
  xz --decompress --stdout "$source/packaging/abi/libzepcore.so.1.abi.xz" | sed "$3" >"$work/changed.abi"
  ! "$source/scripts/abi" "$work/changed.abi" >"$work/log" 2>&1 || { echo "scripts/abi does not find $1" >&2; exit 1; }
  grep -q "$2" "$work/log" && grep -q 'record it: scripts/abi --record' "$work/log" ||
    { echo "scripts/abi does not describe $1:" >&2; cat "$work/log" >&2; exit 1; }
}

finds "a lost function" "1 Removed function" "/<elf-symbol name='_ZN9NQRVZEP2011TOSSpecific14GetZEPRootPath/d; s/ elf-symbol-id='_ZN9NQRVZEP2011TOSSpecific14GetZEPRootPath[^']*'//"
finds "a larger class" "type size changed from 576 to 640" "s/\(<class-decl name='TCIMValue' size-in-bits='\)576/\1640/"
finds "another order of virtual operations" "vtable offset" \
  "/<class-decl name='ICIMClass'/,/<\/class-decl>/{s/vtable-offset='6'/vtable-offset='x'/; s/vtable-offset='7'/vtable-offset='6'/; s/vtable-offset='x'/vtable-offset='7'/}"

xz --decompress --stdout "$source/packaging/abi/libzepcore.so.1.abi.xz" >"$work/more.abi"
sed -i "0,/<elf-symbol .*/s||&<elf-symbol name='_ZN9NQRVZEP203NewEv' type='func-type' binding='global-binding' visibility='default-visibility' is-defined='yes'/>|" "$work/more.abi"
grep -q _ZN9NQRVZEP203NewEv "$work/more.abi"
"$source/scripts/abi" "$work/more.abi" || { echo "scripts/abi refuses a new function" >&2; exit 1; }
