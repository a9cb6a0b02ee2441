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
# The virtual machine has two sockets with two cores each, two NUMA nodes, a PCI Express switch with an NVMe disk, a SATA, a SCSI, a virtio,
# a USB and an SD disk, a CD-ROM drive, ports of two drivers, a TPM, and an IPMI KCS interface.
#
# Needs: what run-in-vm.sh needs, and the packages udev, mdadm, lvm2, iproute2, fdisk, e2fsprogs, smartmontools, pci.ids, swtpm.
set -eu
[ $# = 2 ] || { sed -n '3,18s/^# \{0,1\}//p' "$0" >&2; exit 2; }
here=$(cd "$(dirname "$0")" && pwd)
machine=$1 build=$(cd "$2" && pwd)
work=$(mktemp -d "${TMPDIR:-/tmp}/zep-record.XXXXXX")
tpm=
cleanup() {
  [ -z "$tpm" ] || kill "$tpm" 2>/dev/null || :
  rm -rf "$work"
}
trap cleanup EXIT

for disk in nvme sata virtio sd; do truncate -s 256M "$work/$disk"; done
mkdir "$work/tpm" "$work/out"
swtpm socket --tpm2 --tpmstate "dir=$work/tpm" --ctrl "type=unixio,path=$work/tpm/socket" --flags startup-clear &
tpm=$!
memory="-object memory-backend-ram,size=512M,id=m0 -object memory-backend-ram,size=512M,id=m1"
cpus="-M q35 -smp 4,sockets=2,cores=2 -m 1024 $memory -numa node,cpus=0-1,memdev=m0 -numa node,cpus=2-3,memdev=m1"
switch="-device pcie-root-port,id=root,chassis=1,slot=1 -device x3130-upstream,id=up,bus=root"
switch="$switch -device xio3130-downstream,id=down0,bus=up,chassis=2,slot=2 -device xio3130-downstream,id=down1,bus=up,chassis=3,slot=3"
disks="-drive file=$work/nvme,if=none,id=nv,format=raw -device nvme,drive=nv,serial=NVME0001,bus=down0"
disks="$disks -drive file=$work/sata,if=none,id=sa,format=raw -device ide-hd,drive=sa,serial=SATA0001,wwn=0x5000c500a1b2c3d4,bus=ide.0"
disks="$disks -drive file=$work/virtio,if=none,id=vd,format=raw -device virtio-blk-pci,drive=vd,serial=VIRT0001"
disks="$disks -drive file=$work/sd,if=none,id=sd,format=raw -device sdhci-pci -device sd-card,drive=sd"
ports="-netdev user,id=n0,restrict=on -device e1000e,netdev=n0,bus=down1,mac=52:54:00:11:22:01"
ports="$ports -netdev user,id=n1,restrict=on -device virtio-net-pci,netdev=n1,mac=52:54:00:11:22:02"
tpm_device="-chardev socket,id=tpm,path=$work/tpm/socket -tpmdev emulator,id=tpm0,chardev=tpm -device tpm-tis,tpmdev=tpm0"

set --
for module in nvme virtio_pci virtio_blk virtio_net e1000e ahci sdhci-pci mmc_block md-mod raid1 dm-mod bonding 8021q bridge \
  tpm_tis ipmi_si pcieport acpiphp; do
  modprobe -n -d "${ZEP_TESTBED_CACHE:-${TMPDIR:-/tmp}/zep-testbeds}/kernel-full" \
    -S "$(cat "${ZEP_TESTBED_CACHE:-${TMPDIR:-/tmp}/zep-testbeds}/kernel-full/release")" "$module" 2>/dev/null || continue
  set -- "$@" --module "$module"
done
for program in mdadm lvm ip sfdisk mkfs.ext4 mkfs.vfat smartctl udevadm dmsetup; do
  set -- "$@" --file "$(command -v "$program" || echo "/usr/sbin/$program")"
done
status=0
"$here/run-in-vm.sh" --hw --timeout 180 "$@" \
  --file /lib/systemd/systemd-udevd --file /lib/udev --file /etc/os-release --file /usr/share/misc/pci.ids \
  --file "$build/bin/zep" --file "$build/lib" --file "$here/machines" --file "$here/record-files.sh" \
  --out "$work/out" --qemu "$cpus $switch $disks $ports $tpm_device" \
  sh -c "sh $here/machines/$machine.sh && sh $here/record-files.sh $build/bin/zep" || status=$?
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
