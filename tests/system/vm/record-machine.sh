#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Records the files that describe a virtual server, for tests that replay them below ZEP_ROOT.
#
#   record-machine.sh MACHINE BUILD     writes tests/data/machines/MACHINE.tar.gz and tests/data/machines/MACHINE/
#
# The archive has the files, and the folder the answers to the queries of the provider plug-ins.
#
# MACHINE is a script in the folder machines/ beside this one: it sets up the disks and ports of the virtual machine below. BUILD
# is a build tree with zep and the provider plug-ins, which record the answers to their queries (ZEP_RECORD_ANSWERS).
#
# Needs: what server-vm.sh needs.
set -eu
[ $# = 2 ] || { sed -n '3,13s/^# \{0,1\}//p' "$0" >&2; exit 2; }
here=$(cd "$(dirname "$0")" && pwd)
machine=$1 build=$(cd "$2" && pwd)
work=$(mktemp -d "${TMPDIR:-/tmp}/zep-record.XXXXXX")
trap 'rm -rf "$work"' EXIT
mkdir "$work/out"
status=0
"$here/server-vm.sh" "$machine" "sh $here/record-files.sh $build/bin/zep" --file "$build/bin/zep" --file "$build/lib" \
  --file "$here/record-files.sh" --out "$work/out" || status=$?
[ -e "$work/out/tree" ] || { echo "record-machine.sh: nothing was recorded (status $status)" >&2; exit 1; }
machines=$(cd "$here/../../.." && pwd)/tests/data/machines
archive=$machines/$machine.tar.gz
if [ -e "$work/out/tree/zep-answers" ]; then
  rm -rf "${machines:?}/$machine"
  mkdir "$machines/$machine"
  mv "$work/out/tree/zep-answers" "$machines/$machine/"
fi
tar -C "$work/out/tree" --sort=name --mtime=@0 --owner=0 --group=0 --numeric-owner --mode=u+rw,go+r -cf - . | gzip -9n > "$archive"
ls -l "$archive"
