#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Writes the manual pages zep(1) and zep-COMMAND(1), compressed, from the help texts of zep.
#
#   man-pages.sh ZEP VERSION DIRECTORY
set -euo pipefail
export LC_ALL=C
zep=$1 version=$2 directory=$3
rm -rf "$directory"
mkdir -p "$directory"

# The names of the commands of zep, or of one of its commands.
commands_of() {
  "$zep" help "$@" | awk '/^Subcommands:/ { inside = 1; next } inside && /^  [a-z]/ { print $1 } inside && /^$/ { exit }'
}

# The text as it is: no character has a meaning for roff.
verbatim() { sed -e 's/\\/\\e/g' -e "s/^[.']/\\\\\&&/" -e 's/-/\\-/g'; }

# Its first line is the summary; the usage and the options follow.
page() {  # page COMMAND...
  local name=zep text summary
  for word in "$@"; do name+=-$word; done
  text=$("$zep" help "$@")
  summary=$(head -n 1 <<<"$text")
  {
    printf '.TH %s 1 "" "zepcore %s" "zepcore"\n' "${name^^}" "$version"
    printf '.SH NAME\n%s \\- %s\n' "$name" "$(verbatim <<<"$summary")"
    printf '.SH DESCRIPTION\n.nf\n'
    tail -n +2 <<<"$text" | verbatim
    printf '.fi\n.SH SEE ALSO\n'
    [[ $# == 0 ]] && printf '.BR zep\\-report (1)\n' || printf '.BR zep (1)\n'
  } | gzip -9 -n >"$directory/$name.1.gz"
}

page
for command in $(commands_of); do
  page "$command"
  for below in $(commands_of "$command"); do page "$command" "$below"; done
done
