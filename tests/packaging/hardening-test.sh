#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Installs the build tree given into a fresh prefix and reads from every program and library there how it was hardened.
#
#   hardening-test.sh BUILD_DIR
set -euo pipefail
export LC_ALL=C
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT
cmake --install "$1" --prefix "$work/prefix" >"$work/install.log"

failures=0
missing() {  # missing FILE WHAT
  printf '%s: %s\n' "${1#"$work/prefix/"}" "$2" >&2
  failures=$((failures + 1))
}

# Full RELRO, no executable stack, position-independent code.
check_layout() {
  local headers dynamic
  headers=$(readelf --wide --file-header --program-headers "$1") dynamic=$(readelf --wide --dynamic "$1")
  grep -q 'Type: *DYN' <<<"$headers" || missing "$1" "not position-independent"
  grep -q 'GNU_RELRO' <<<"$headers" || missing "$1" "no read-only relocations (RELRO)"
  grep -q 'GNU_STACK .* RW ' <<<"$headers" || missing "$1" "the stack is executable"
  grep -q 'FLAGS_1.*NOW' <<<"$dynamic" || missing "$1" "symbols are not bound at the start (BIND_NOW)"
  ! grep -q 'TEXTREL' <<<"$dynamic" || missing "$1" "text relocations"
  [[ $1 == *.so ]] || grep -q 'FLAGS_1.*PIE' <<<"$dynamic" || missing "$1" "not a position-independent executable (PIE)"
}

# The stack protector and _FORTIFY_SOURCE show in the functions imported from the C library. The standard library takes the
# address of vsnprintf, which is never replaced.
check_imports() {
  local imports plain
  imports=$(nm --dynamic --undefined-only "$1" | sed 's/.* //; s/@.*//')
  grep -qx '__stack_chk_fail' <<<"$imports" || missing "$1" "no stack protector"
  plain=$(grep -xE 'v?[sf]?printf|snprintf' <<<"$imports" | paste -sd' ') || true
  [[ -z $plain ]] || missing "$1" "unchecked calls, which _FORTIFY_SOURCE would replace: $plain"
}

# Control-flow protection marks the start of every function that can be called indirectly; the files bear no note of it, which
# the linker drops because the start-up objects of Debian's C library have none. Stack clash protection never moves the stack
# pointer by more than a page at once.
check_code() {
  objdump --disassemble --no-show-raw-insn --section=.text "$1" >"$work/code"
  local unmarked
  unmarked=$(nm --dynamic --defined-only "$1" | awk '$2 ~ /[TW]/ { print $1 }' | sort -u |
    awk 'FNR == NR { start[$1]; next } /^[0-9a-f]+ </ { isStart = $1 in start; name = $2; next }
         isStart && NF { if ($2 != "endbr64" && ++count <= 3) print name; isStart = 0 }' - "$work/code" | paste -sd' ')
  [[ -z $unmarked ]] || missing "$1" "no control-flow protection at the start of $unmarked"
  grep -q 'endbr64' "$work/code" || missing "$1" "no control-flow protection"
  ! grep -qE 'sub +\$0x(100[1-9a-f]|10[1-9a-f].|1[1-9a-f]..|[2-9a-f]...|[1-9a-f].{4,7}),%rsp' "$work/code" ||
    missing "$1" "no stack clash protection"
}

files=0
while read -r file; do
  readelf --file-header "$file" >/dev/null 2>&1 || continue
  [[ $file != *.a ]] || continue
  check_layout "$file"
  check_imports "$file"
  check_code "$file"
  files=$((files + 1))
done < <(find "$work/prefix" -type f)

((files >= 6)) || { echo "only $files programs and libraries were installed" >&2; exit 1; }
((failures == 0)) || exit 1
echo "$files programs and libraries are hardened"
