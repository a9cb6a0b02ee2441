#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Completes command lines of zep in bash, fish and zsh, with the scripts that zep prints.
#
#   completion-test.sh ZEP
set -euo pipefail
export LC_ALL=C
zep=$1
work=$(realpath "$(mktemp -d)")
trap 'rm -rf "$work"' EXIT
touch "$work/server.json"
cd "$work"

fail() {
  echo "$1" >&2
  exit 1
}

# The words with which the shell completes the last word of the line, sorted, on one line. Each shell has its own function.
in_bash() {
  bash --norc -c 'source "$1"; COMP_WORDS=("${@:2}"); COMP_CWORD=$(($# - 2)); _zep; printf "%s\n" "${COMPREPLY[@]}"' \
    bash "$work/bash" "$@" | sort | xargs
}
in_fish() {
  HOME=$work fish --no-config -c 'source $argv[1]; complete -C "$argv[2..]"' "$work/fish" "$@" | cut -f 1 | sort | xargs
}

expect() {  # expect SHELL WORDS WORD...
  local found
  found=$("in_$1" "${@:3}")
  [[ $found == "$2" ]] || fail "$1 completes \"${*:3}\" with \"$found\", not with \"$2\""
}

check_bash() {
  expect bash "json jsonl" zep report --format = js
}
check_fish() {
  expect fish "server.json" zep diff serv
}

# At a terminal, because only its line editor completes. The line is then run, by a function in place of zep.
check_zsh() {
  local found
  found=$(HOME=$work zsh -f -c '
    zmodload zsh/zpty
    zpty shell "TERM=dumb PS1= zsh -f -i"
    zpty -w shell "fpath=($1 \$fpath); autoload -U compinit; compinit -D -u; zep() { print -r -- \"ran: \$*;\" }"
    for line in "repo\t--fo\tjs\t" "media u\t--j\t" "diff serv\t" "report --fail-on=inf\t"; do
      zpty -w shell "zep ${(g::)line}"
      zpty -r shell answer "*ran: [a-z]*;*"
      print -r -- "$answer"
    done' zsh "$work" | grep -o 'ran: [a-z].*;')
  [[ $found == "ran: report --format json;
ran: media umount --json;
ran: diff server.json;
ran: report --fail-on=information;" ]] || fail "zsh completes otherwise: $found"
}

for shell in bash fish zsh; do
  if ! command -v "$shell" >/dev/null; then
    [[ ${CI:-} != true ]] || fail "$shell is not installed"
    echo "$shell is not installed: its completion is not checked"
    continue
  fi
  "$zep" help --completion "$shell" >"$work/$shell"
  cp "$work/$shell" "$work/_zep"  # the name by which zsh finds it, which is the last one
  if [[ $shell != zsh ]]; then
    expect "$shell" "record remote report" zep re
    expect "$shell" "--format" zep report --fo
    expect "$shell" "json jsonl" zep report --format js
    expect "$shell" "list mount umount" zep media ""
    expect "$shell" "--json" zep media mount --j
  fi
  "check_$shell"
done
echo "all shells complete the command line of zep"
