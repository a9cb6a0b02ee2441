# SPDX-License-Identifier: Apache-2.0

# Runs in the virtual machine: performs the operations on removable media and stores their results. Each file in /out is checked
# by one test of MediaVmTest.cpp.
#
#   in-vm.sh PROBE ZEP PULLSOUT
probe=$1 zep=$2 pulls_out=$3
usb_disk=/sys/kernel/config/usb_gadget/g0/UDC  # the controller's virtual disk; unplugged by writing an empty line

wait_for() {  # wait_for [!] FILE: until FILE exists or, with !, is gone; up to 10 s
  tries=0
  while [ $tries -lt 100 ]; do
    if [ "$1" = ! ]; then [ -e "$2" ] || return 0; else [ ! -e "$1" ] || return 0; fi
    tries=$((tries + 1))
    sleep 0.1
  done
  echo "in-vm.sh: timed out after 10 s waiting for $*" >&2
}
udc=$(cat $usb_disk)
unplug="echo > $usb_disk; while [ -e /dev/sdc ]; do sleep 0.1; done"
plug_in() {
  echo "$udc" > $usb_disk
  wait_for /dev/sdc
  wait_for /sys/class/block/sdc/device/vendor
}
key_mounts() { grep ' /mnt/key ' /proc/mounts | cut -d ' ' -f 1-3; }

# ---- The library ----

"$probe" virtual 0 1 > /out/virtual-disk
"$probe" virtual 1 1 > /out/virtual-cdrom
"$probe" virtual 2 0 > /out/virtual-keyboard
"$probe" virtual 3 0 > /out/virtual-mouse

"$probe" enumerate > /out/enumerate
key_mounts >> /out/enumerate
umount /mnt/key

"$probe" ids /dev/sg0 /dev/sg3 2:0:0:0 /dev/sg9 /dev/sda 9:9:9:9 > /out/ids
umount /mnt/key

for device in /dev/sda /dev/sdb /dev/sdc /dev/fd0 /dev/sr0 /dev/sdz; do
  "$probe" mount $device
  grep ' /mnt/' /proc/mounts | cut -d ' ' -f 1-3
  umount /mnt/key /mnt/floppy 2> /dev/null
done > /out/mounts

{
  "$probe" mount /dev/sdb
  "$probe" mount /dev/sdc
  key_mounts
  "$probe" umount /dev/sdz /mnt/key
  "$probe" umount /dev/sdz /mnt/key
  key_mounts
} > /out/second-key

"$probe" enumerate "$unplug" > /out/vanished
umount /mnt/key
plug_in

# ---- zep ----

"$zep" media --json > /out/list.json
"$zep" media mount /dev/sdb > /out/zep-mount 2>&1
"$zep" media --json > /out/list-mounted.json
"$zep" media umount /mnt/key >> /out/zep-mount 2>&1
key_mounts >> /out/zep-mount

"$zep" media --json > /out/list-full.json
"$probe" eject /dev/sr0
"$zep" media --json > /out/list-empty.json

{
  "$zep" report --sample --to-media /dev/sdb
  echo "exit status $?"
  key_mounts
  mount /dev/sdb1 /mnt/key
  cat /mnt/key/zep-report-*
  umount /mnt/key
} > /out/report 2>&1

{
  mount /dev/sdc /mnt/key
  dd if=/dev/zero of=/mnt/key/filler bs=512 2> /dev/null
  umount /mnt/key
  "$zep" report --sample --to-media /dev/sdc
  echo "exit status $?"
  mount /dev/sdc /mnt/key
  ls /mnt/key
  rm /mnt/key/filler
  umount /mnt/key
} > /out/full 2>&1

{
  blockdev --setro /dev/sdc
  "$zep" report --sample --to-media /dev/sdc
  echo "exit status $?"
  key_mounts
  blockdev --setrw /dev/sdc
} > /out/read-only 2>&1

# The medium is pulled out before the first sync, which is that of the file, and before the second, which is that of the
# directory.
for sync in 1 2; do
  {
    ZEP_PULL="$unplug" ZEP_PULL_AT=$sync LD_PRELOAD="$pulls_out" "$zep" report --sample --to-media /dev/sdc
    echo "exit status $?"
    key_mounts
    plug_in
    mount /dev/sdc /mnt/key
    ls /mnt/key
    umount /mnt/key
  } > /out/pulled-out-$sync 2>&1
done
