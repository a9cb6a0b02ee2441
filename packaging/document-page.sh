#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Prints a manual page that consists of sections of the documents, so that both say the same.
#
#   document-page.sh NAME SECTION VERSION SUMMARY SEE_ALSO DOCUMENT HEADING [DOCUMENT HEADING]...
#
# The manual page has the section HEADING of each DOCUMENT under the same heading. SEE_ALSO is a list such as "zep(1), zep.cfg(5)".
set -euo pipefail
export LC_ALL=C.UTF-8
name=$1 section=$2 version=$3 summary=$4 see_also=$5
shift 5

# A section of a document, under the heading in capitals.
section_of() {  # section_of DOCUMENT HEADING
  awk -v heading="$2" '
    /^```/ { inCode = !inCode }
    /^## / && !inCode {
      inside = index($0, "## " heading) == 1
      if (inside) { found = 1; print "# " toupper(heading) }
      next
    }
    inside
    END { exit !found }' "$1" || { echo "document-page.sh: $1 has no section $2" >&2; exit 1; }
}

{
  printf '# NAME\n\n%s - %s\n\n' "$name" "$summary"
  while [[ $# -gt 0 ]]; do
    section_of "$1" "$2"
    shift 2
  done
  printf '\n# SEE ALSO\n\n%s\n' "$see_also"
} | lowdown -s -Tman --out-no-smarty --nroff-nolinks -M title="$name" -M section="$section" -M source="zepcore $version" |
  sed "s/\\\\fC/\\\\fB/g; 1i'\\\\\" t
    /^\.TH /a.ad l\n.nh"  # code is bold; tables need the preprocessor tbl; names of settings are not hyphenated
