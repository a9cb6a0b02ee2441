#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# A server whose disks and ports are all well: a mirror (MD) of two disks with a file system, a volume group (LVM), file
# systems on SATA, NVMe and USB; a bond of two ports with a VLAN in a bridge, addresses and routes.
set -eu
hostname server
echo server > /etc/hostname
# The rules of udev call these by their traditional places.
for program in dmsetup lvm mdadm; do [ -e /sbin/$program ] || ln -s "$(command -v $program)" /sbin/$program; done
export DM_DISABLE_UDEV=1  # the tools of LVM do not wait for udev
/lib/systemd/systemd-udevd --daemon
udevadm trigger --action=add
udevadm settle

disk() {  # disk SERIAL: the node of the disk
  for block in /sys/block/*; do
    for file in "$block/serial" "$block/device/serial"; do
      if [ -e "$file" ] && [ "$(tr -d ' ' < "$file")" = "$1" ]; then echo "/dev/${block##*/}"; return; fi
    done
  done
  for link in /dev/disk/by-id/*"$1"; do [ ! -e "$link" ] || { readlink -f "$link"; return; }; done
  echo "no disk $1" >&2
  exit 1
}
nvme=$(disk NVME0001) virtio=$(disk VIRT0001) sata=$(disk SATA0001)
for node in "$nvme" "$virtio" "$sata"; do
  printf 'label: gpt\n,100M,linux\n,100M,linux\n' | sfdisk -q "$node"
done
udevadm settle
part() { case $1 in *[0-9]) echo "$1p$2" ;; *) echo "$1$2" ;; esac; }

mdadm --create /dev/md0 --run --level=1 --raid-devices=2 --metadata=1.2 --name=mirror --homehost=server \
  "$(part "$nvme" 1)" "$(part "$virtio" 1)" 2>&1
mdadm --wait /dev/md0 || :
mkfs.ext4 -q -L data /dev/md0
mkdir -p /data /boot/efi /srv/logs /mnt/usb
mount -o noatime /dev/md0 /data
dd if=/dev/zero of=/data/file bs=1M count=20 2>/dev/null

lvm pvcreate -q "$(part "$sata" 1)" "$(part "$virtio" 2)"
lvm vgcreate -q vg0 "$(part "$sata" 1)" "$(part "$virtio" 2)"
lvm lvcreate -q -n logs -L 64M vg0
lvm lvcreate -q -n spare -L 100M vg0
mkfs.ext4 -q -L logs /dev/vg0/logs
mount -o ro /dev/vg0/logs /srv/logs
mkfs.vfat -n ESP "$(part "$nvme" 2)" >/dev/null
mount "$(part "$nvme" 2)" /boot/efi
mkfs.ext4 -q -L spare "$(part "$sata" 2)"
for usb in /dev/disk/by-id/usb-*part1; do [ ! -e "$usb" ] || mount "$usb" /mnt/usb; done
udevadm trigger --action=change --subsystem-match=block
udevadm settle

. "${0%/*}/ports.sh"
