#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Compares zep's description of a virtual server with those of other tools in the same machine, fact by fact: of a healthy server,
# and of the same one with a failed disk and a failed port.
#
#   compare-machine.sh BUILD [DIRECTORY [MACHINES]]    exit status: 0 if every fact is described or has a listed reason,
#                                                      otherwise 1; 77 if a program is missing, unless CI is "true"
#
# BUILD is a build tree with zep and the provider plug-ins. DIRECTORY, if it is given and not empty, receives the outputs of all
# tools, in a folder for each server. MACHINES: "server", "degraded", or without it "server degraded".
# compare-machine.py explains the comparison.
#
# Needs: what server-vm.sh needs, and the packages lshw, pciutils, util-linux, iproute2, ethtool, dmidecode, python3.
set -eu
[ $# -ge 1 ] || { sed -n '3,13s/^# \{0,1\}//p' "$0" >&2; exit 2; }
here=$(cd "$(dirname "$0")" && pwd)
build=$(cd "$1" && pwd) outputs=${2:-} machines=${3:-server degraded}
programs="lshw lspci lsblk lscpu dmidecode ethtool mdadm lvm ip sfdisk mkfs.ext4 smartctl udevadm swtpm python3 qemu-system-x86_64"
for program in $programs; do
  PATH=$PATH:/usr/sbin command -v "$program" >/dev/null && continue
  echo "compare-machine.sh: $program is missing" >&2
  [ "${CI:-}" = true ] && exit 1
  exit 77
done
"$here/fetch-kernel.sh" full >/dev/null
work=$(mktemp -d "${TMPDIR:-/tmp}/zep-compare.XXXXXX")
trap 'rm -rf "$work"' EXIT
set --
for program in lshw lspci lsblk lscpu dmidecode ethtool; do
  set -- "$@" --file "$(command -v "$program" || echo "/usr/sbin/$program")"
done
status=0
for machine in $machines; do
  mkdir "$work/$machine"
  "$here/server-vm.sh" "$machine" "sh $here/ask-tools.sh $build/bin/zep" "$@" --file "$here/ask-tools.sh" \
    --file "$build/bin/zep" --file "$build/lib" --out "$work/$machine" >/dev/null
  [ -z "$outputs" ] || { mkdir -p "$outputs"; cp -r "$work/$machine" "$outputs/"; }
  echo "$machine:"
  python3 -B "$here/compare-machine.py" "$work/$machine" || status=1
done
exit $status
