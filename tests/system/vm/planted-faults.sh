#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Plants faults in a virtual machine: an array member that is pulled out while it is used, a full file system, an unplugged
# cable, a process killed for lack of memory, a disk with errors, a machine check, a sensor beyond its threshold, and a clock
# that is not synchronised. zep must find each with its remedy, nothing before, and nothing after they are mended.
#
#   planted-faults.sh BUILD [DIRECTORY]    exit status: 0 if it does, otherwise 1; 77 if a program is missing, unless CI is "true"
#
# BUILD is a build tree with zep and the provider plug-ins. DIRECTORY, if given, receives zep's documents.
# QEMU cannot narrow the link of a PCI Express device, so that this fault is not among them.
#
# Needs: what run-in-vm.sh needs, and the packages mdadm, dmsetup, iproute2, e2fsprogs, perl, python3.
set -eu
[ $# -ge 1 ] || { sed -n '3,13s/^# \{0,1\}//p' "$0" >&2; exit 2; }
here=$(cd "$(dirname "$0")" && pwd)
build=$(cd "$1" && pwd) outputs=${2:-}
for program in perl mdadm dmsetup ip mkfs.ext4 python3 qemu-system-x86_64; do
  PATH=$PATH:/usr/sbin command -v "$program" >/dev/null && continue
  echo "planted-faults.sh: $program is missing" >&2
  [ "${CI:-}" = true ] && exit 1
  exit 77
done
"$here/fetch-kernel.sh" full >/dev/null
kernel=${ZEP_TESTBED_CACHE:-${TMPDIR:-/tmp}/zep-testbeds}/kernel-full
stub=$(find "$kernel/lib/modules" -name i2c-stub.ko)
work=$(mktemp -d "${TMPDIR:-/tmp}/zep-faults.XXXXXX")
trap 'rm -rf "$work"' EXIT

devices="-M q35"
truncate -s 64M "$work/disk0" "$work/disk1"
for number in 0 1; do
  devices="$devices -blockdev driver=raw,node-name=d$number,file.driver=file,file.filename=$work/disk$number"
  devices="$devices -netdev user,id=n$number,restrict=on -device virtio-net-pci,netdev=n$number"
done
devices="$devices -device virtio-blk-pci,drive=d0 -device virtio-scsi-pci,id=scsi -device scsi-hd,bus=scsi.0,drive=d1,id=member"
monitor="-chardev socket,id=monitor,path=$work/monitor,server=on,wait=off -mon chardev=monitor,mode=control"
monitor="$monitor -chardev socket,id=serial,path=$work/monitor -serial chardev:serial"
set --
for module in virtio_pci virtio_blk virtio_scsi sd_mod virtio_net md-mod raid1 dm-mod ext4 bonding lm75; do set -- "$@" --module "$module"; done
for program in perl mdadm dmsetup ip mkfs.ext4; do
  set -- "$@" --file "$(PATH=$PATH:/usr/sbin command -v "$program")"
done
status=0
"$here/run-in-vm.sh" "$@" --file "$stub" --file "$here/plant-faults.sh" --file "$build/bin/zep" --file "$build/lib" --file /etc/os-release \
  --out "$work/out" --timeout 400 --qemu "$devices $monitor" sh "$here/plant-faults.sh" "$build/bin/zep" "$stub" \
  > "$work/output" 2>&1 || status=$?
[ -z "$outputs" ] || { mkdir -p "$outputs"; cp -r "$work/output" "$work/out/." "$outputs/"; }
[ $status = 0 ] || { cat "$work/output" >&2; exit 1; }
python3 -B "$here/planted-faults.py" "$work/out"
