#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Looks for problems in a container: a bare tree with network, devices and processes of its own. zep must find nothing but what the
# container shares with its host, the state of the kernel, its clock and the processor; and this only if it finds it outside, too.
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

# The libraries of zep and the plug-ins, but those of libc6, which belong to the tree's loader.
ldd "$build/bin/zep" "$build"/lib/*.nsp.so | awk '/=> \// { print $3 }' | grep -v "^$build/" |
  grep -Ev '/lib(c|dl|m|pthread|resolv|rt)[.]so[.]' | sort -u | xargs cp -t "$work/lib"

# The container has only null in /dev. zep ends with 2 if the machine has no serial number.
cat > "$work/ask" <<'END'
set -eu
mount -t tmpfs tmpfs /mnt
touch /mnt/null
mount --bind /dev/null /mnt/null
mount --move /mnt /dev
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
    document = json.load(open(path))
    for plugin in document["plugIns"]:
        errors = [plugin["error"]] + [provider["error"] for provider in plugin["providers"]]
        if any(errors):
            sys.exit(f"{path}: {plugin['name']} failed: {errors}")
    return {each["rule"] for each in document["findings"]["problems"]}

OF_KERNEL = {"clock-synchronized", "kernel-taint", "processor-weakness"}
container, machine = (problems(path) for path in sys.argv[1:])
print(f"in the container: {sorted(container)}, outside: {sorted(machine)}")
wrong = sorted(container - (OF_KERNEL & machine))
for each in wrong:
    print(f"a healthy container has {each}")
sys.exit(1 if wrong else 0)
END
