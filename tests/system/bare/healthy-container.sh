#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Looks for problems in a container: a bare tree with network, devices and processes of its own. zep must find nothing that it does
# not find outside of the container as well, such as the state of the clock, which is that of the kernel.
#
#   healthy-container.sh BUILD    exit status: 0 if it does, otherwise 1; 77 if no container can be made, unless CI is "true"
#
# BUILD is a build tree with zep and the provider plug-ins. Needs: what run-in-bare-tree.sh needs, and python3.
set -eu
[ $# = 1 ] || { sed -n '3,9s/^# \{0,1\}//p' "$0" >&2; exit 2; }
here=$(cd "$(dirname "$0")" && pwd)
build=$(cd "$1" && pwd)
work=$(mktemp -d "${TMPDIR:-/tmp}/zep-container.XXXXXX")
trap 'rm -rf "$work"' EXIT
mkdir "$work/bin"
cp "$build/bin/zep" "$work/bin/"
cp -r "$build/lib" "$work/"

# The container has an empty /dev but for what every container has. zep ends with 2 if the machine has no serial number.
cat > "$work/ask" <<'END'
set -eu
mount -t tmpfs tmpfs /dev
mknod -m 666 /dev/null c 1 3
LD_LIBRARY_PATH=/share/lib /share/bin/zep report --json > /share/container.json || [ $? = 2 ]
END
status=0
"$here/run-in-bare-tree.sh" --share "$work" unshare --mount --net --uts --ipc sh /share/ask || status=$?
if [ $status = 125 ] && [ "${CI:-}" != true ]; then exit 77; fi
[ $status = 0 ] || exit 1
"$build/bin/zep" report --json > "$work/machine.json" || [ $? = 2 ]

python3 - "$work/container.json" "$work/machine.json" <<'END'
import json
import sys

def problems(path):
    return {f"{each['rule']}: {each['reason']}" for each in json.load(open(path))["findings"]["problems"]}

container, machine = (problems(path) for path in sys.argv[1:])
print(f"{len(container)} findings in the container, {len(machine)} outside")
added = sorted(container - machine)
for each in added:
    print(f"only in the container: {each}")
sys.exit(1 if added else 0)
END
