#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Makes the reference of the headers: Doxygen reports nothing, and the comments before and after an item are in it.
#
#   reference-test.sh SOURCE_DIR
set -euo pipefail
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT
command -v doxygen >/dev/null || { [[ ${CI:-} != true ]] && exit 77; echo "the package doxygen is not installed" >&2; exit 1; }
"$1/scripts/reference" "$work"
grep -q 'Makes this an interval' "$work/html/classNQRVZEP20_1_1TCIMDateTime.html"
grep -q 'it has no superclass' "$work/html/classNQRVZEP20_1_1ICIMClass.html"
