#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Runs the commands of pages, word by word, for one reader. Each page is one shell session, which starts in the current
# directory.
#
#   run-pages.sh [--all] source|kit RESULTS DIRECTORY PAGE...
#
# DIRECTORY has the pages. The first word after the fence states the kind of the block. The second word "kit" means that the
# block is for the reader with the installed packages; otherwise it is for the reader in the source tree:
#
#   sh [kit]          commands, one on each line; a backslash at its end continues a line
#   console [kit]     commands, each after "$ ", and below each its output, in which "..." stands for any text
#   cpp|cmake|mof [FILE]
#                     a source; with a name, all of a file, which the reader with the packages saves under that name
#   text              anything else, without commands
#
# A command must end with status 0, or with the status that its comment states: "# exit status 2". The run ends with status 1 at
# the first command with another status or other output than on the page, and at the first block of another form.
#
# The only command that is passed over is scripts/test, unless --all is given, because .ci/run runs it. Each command and each
# text block becomes a line of the file RESULTS: "ran" or "passed over", the place on the page, the seconds or a dash, and the
# command or the reason, separated by tabs.

# The commands see this shell, so it has no options that change their effect, such as errexit.
all=no
[[ $1 != --all ]] || { all=yes; shift; }
reader=$1 results=$(realpath "$2") directory=$(realpath "$3")
shift 3
output=$(mktemp)
trap 'rm -f "$output"' EXIT

refuse() { printf '%s:%s: %s\n' "$page" "$number" "$1" >&2; exit 1; }

record() { printf '%s\t%s:%s\t%s\t%s\n' "$1" "$page" "$number" "$2" "$3" >>"$results"; }

# The text as a pattern of bash in which only "..." matches more than itself.
pattern_of() { sed 's/[^A-Za-z0-9 ]/\\&/g; s/\\\.\\\.\\\./*/g' <<<"$1"; }

# run_command COMMAND [EXPECTED_OUTPUT]; `number` is the line of the command.
run_command() {
  local command=$1 words=${1%%[[:blank:]]#*} expected_status=0 status begin=$EPOCHREALTIME
  words=${words%"${words##*[![:blank:]]}"}
  if [[ $words == scripts/test && $all == no ]]; then
    record "passed over" - "scripts/test: run by .ci/run itself"
    return
  fi
  [[ ! $command =~ \#.*exit\ status\ ([0-9]+) ]] || expected_status=${BASH_REMATCH[1]}
  eval "$command" <"/dev/null" >"$output" 2>&1
  status=$?
  local tenths=$(((${EPOCHREALTIME/./} - ${begin/./} + 50000) / 100000))
  local seconds=$((tenths / 10)).$((tenths % 10))
  printf '%6s s  %s:%s: %s\n' "$seconds" "$page" "$number" "$command"
  if [[ $status != "$expected_status" ]]; then
    cat "$output" >&2
    refuse "exit status $status instead of $expected_status: $command"
  fi
  # shellcheck disable=SC2053  # a pattern
  if [[ $# -gt 1 && $(<"$output") != $(pattern_of "$2") ]]; then
    diff <(printf '%s\n' "$2") "$output" >&2
    refuse "other output than on the page: $command"
  fi
  record ran "$seconds" "$command"
}

# Both read the block from `body`, whose first line is line `first` of the page.
run_sh() {
  local command='' line at=0
  for line in "${body[@]}"; do
    [[ -n $command ]] || number=$((first + at))
    at=$((at + 1))
    [[ -n $command || $line =~ ^[[:blank:]]*[^#[:blank:]] ]] || continue
    command+=$line
    if [[ $line == *\\ ]]; then command+=$'\n'; continue; fi
    run_command "$command"
    command=''
  done
  [[ -z $command ]] || refuse "the last line of the block ends with a backslash"
}

run_console() {
  [[ ${body[0]} == '$ '* ]] || refuse "a console block begins with a command after \"\$ \""
  local at end
  for ((at = 0; at < ${#body[@]}; at = end)); do
    for ((end = at + 1; end < ${#body[@]}; ++end)); do [[ ${body[end]} != '$ '* ]] || break; done
    number=$((first + at))
    run_command "${body[at]#\$ }" "$(printf '%s\n' "${body[@]:at + 1:end - at - 1}")"
  done
}

pass_over_text() {
  local line
  for line in "${body[@]}"; do
    [[ ! $line =~ ^(\$ |scripts/|build/|zep |cmake |ctest |apt-get |g\+\+ ) ]] || refuse "a text block with a command: $line"
  done
  [[ $reader != source ]] || record "passed over" - "text: ${body[0]}"
}

save_file() {
  [[ $reader == kit ]] || return
  mkdir -p "$(dirname "$place/$1")"
  printf '%s\n' "${body[@]}" >"$place/$1"
}

handle_block() {
  local kind word
  read -r kind word <<<"$info"
  case $kind/$word in
    sh/ | console/) [[ $reader != source ]] || "run_$kind" ;;
    sh/kit | console/kit) [[ $reader != kit ]] || "run_$kind" ;;
    cpp/ | cmake/ | mof/) ;;
    cpp/* | cmake/* | mof/*) save_file "$word" ;;
    text/) pass_over_text ;;
    *) refuse "a block of unknown form: \"$info\"" ;;
  esac
}

run_page() {
  page=$1
  local place=$PWD lines line at=0 isInside=no info body first
  mapfile -t lines <"$2"
  for line in "${lines[@]}"; do
    at=$((at + 1))
    if [[ $line == '```'* && $isInside == no ]]; then
      isInside=yes info=${line#'```'} body=() first=$((at + 1)) number=$at
    elif [[ $line == '```'* ]]; then
      isInside=no
      handle_block
    elif [[ $isInside == yes ]]; then
      body+=("$line")
    fi
  done
  [[ $isInside == no ]] || refuse "the last block has no end"
}

for page in "$@"; do
  (
    trap '[[ ${isComplete:-no} == yes ]] || exit 1' EXIT  # also when a command calls exit
    run_page "$page" "$directory/$page"
    isComplete=yes
  ) || exit 1
done
