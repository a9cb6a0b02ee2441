#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Runs a command in a virtual server that was set up by a script of the folder machines/ beside this one.
#
#   server-vm.sh MACHINE COMMAND [options of run-in-vm.sh]
#
# MACHINE is the name of the script without ".sh": "server", "degraded". COMMAND is one word, which a shell reads.
#
# The virtual machine has two sockets with two cores each, two NUMA nodes, eight memory modules, a PCI Express switch with an NVMe
# disk, a SATA, a SCSI, a virtio, a USB and an SD disk, a CD-ROM drive, ports of two drivers, a TPM, and an IPMI KCS interface. Its
# firmware describes the boards, processors, caches, modules and slots that server-smbios.py lists.
#
# Needs: what run-in-vm.sh needs, and the packages udev, mdadm, lvm2, iproute2, fdisk, e2fsprogs, smartmontools, pci.ids, swtpm,
# python3.
set -eu
[ $# -ge 2 ] || { sed -n '3,16s/^# \{0,1\}//p' "$0" >&2; exit 2; }
here=$(cd "$(dirname "$0")" && pwd)
machine=$1 command=$2
shift 2
work=$(mktemp -d "${TMPDIR:-/tmp}/zep-server.XXXXXX")
tpm=
cleanup() {
  [ -z "$tpm" ] || kill "$tpm" 2>/dev/null || :
  rm -rf "$work"
}
trap cleanup EXIT

for disk in nvme sata virtio sd; do truncate -s 256M "$work/$disk"; done
mkdir "$work/tpm"
swtpm socket --tpm2 --tpmstate "dir=$work/tpm" --ctrl "type=unixio,path=$work/tpm/socket" --flags startup-clear &
tpm=$!
memory="-object memory-backend-ram,size=512M,id=m0 -object memory-backend-ram,size=512M,id=m1"
mkdir "$work/smbios"
firmware=$(python3 "$here/server-smbios.py" "$work/smbios")
cpus="-M q35,smbios-entry-point-type=64 -smp 4,sockets=2,cores=2 -m 1024 $memory -numa node,cpus=0-1,memdev=m0 -numa node,cpus=2-3,memdev=m1"
switch="-device pcie-root-port,id=root,chassis=1,slot=1 -device x3130-upstream,id=up,bus=root"
switch="$switch -device xio3130-downstream,id=down0,bus=up,chassis=2,slot=2"
switch="$switch -device xio3130-downstream,id=down1,bus=up,chassis=3,slot=3"
disks="-drive file=$work/nvme,if=none,id=nv,format=raw -device nvme,drive=nv,serial=NVME0001,bus=down0"
disks="$disks -drive file=$work/sata,if=none,id=sa,format=raw"
disks="$disks -device ide-hd,drive=sa,serial=SATA0001,wwn=0x5000c500a1b2c3d4,bus=ide.0"
disks="$disks -drive file=$work/virtio,if=none,id=vd,format=raw -device virtio-blk-pci,drive=vd,serial=VIRT0001"
disks="$disks -drive file=$work/sd,if=none,id=sd,format=raw -device sdhci-pci -device sd-card,drive=sd"
ports="-netdev user,id=n0,restrict=on -device e1000e,netdev=n0,bus=down1,mac=52:54:00:11:22:01"
ports="$ports -netdev user,id=n1,restrict=on -device virtio-net-pci,netdev=n1,mac=52:54:00:11:22:02"
tpm_device="-chardev socket,id=tpm,path=$work/tpm/socket -tpmdev emulator,id=tpm0,chardev=tpm -device tpm-tis,tpmdev=tpm0"

kernel=${ZEP_TESTBED_CACHE:-${TMPDIR:-/tmp}/zep-testbeds}/kernel-full
for module in nvme virtio_pci virtio_blk virtio_net e1000e ahci sdhci-pci mmc_block md-mod raid1 dm-mod bonding veth 8021q bridge \
  tpm_tis ipmi_si pcieport acpiphp; do
  modprobe -n -d "$kernel" -S "$(cat "$kernel/release")" "$module" 2>/dev/null || continue
  set -- "$@" --module "$module"
done
for program in mdadm lvm ip sfdisk mkfs.ext4 mkfs.vfat smartctl udevadm dmsetup systemctl unshare; do
  set -- "$@" --file "$(command -v "$program" || echo "/usr/sbin/$program")"
done
"$here/run-in-vm.sh" --hw --timeout 600 "$@" --file "$here/machines" \
  --file /lib/systemd/systemd --file /lib/systemd/systemd-udevd --file /lib/udev --file /etc/os-release --file /usr/share/misc/pci.ids --qemu "$cpus $firmware $switch $disks $ports $tpm_device" \
  sh -c "sh $here/machines/$machine.sh && $command"
