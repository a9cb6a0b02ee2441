#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Lets zep look for problems in this virtual machine: healthy, with faults, and mended. Runs inside the machine of
# planted-faults.sh. Its third serial port is QEMU's monitor (QMP), by which it unplugs a cable and
# pulls out a disk.
#
#   plant-faults.sh ZEP I2C_STUB      I2C_STUB: the kernel module of that name
#
# Leaves the findings in /out, as the JSON documents of `zep report`.
set -eu
zep=$1 i2c_stub=$2
cd /tmp
echo finding-clock-grace-minutes=0 > zep.cfg

ask() {  # ask NAME: writes the report
  "$zep" report --json --plugin-timeout 120 > "/out/$1.json" 2> "/out/$1.err"
}
disk() { for name in /sys/block/sd*; do [ ! -e "$name" ] || echo "/dev/${name##*/}"; done; }  # the second disk
await() {  # await COMMAND...: until it succeeds
  for _ in $(seq 100); do if "$@"; then return; fi; sleep 0.1; done
  echo "timed out: $*" >&2
  exit 1
}
has_disk() { [ -n "$(disk)" ]; }
has_no_disk() { [ -z "$(disk)" ]; }
qmp() { printf '\377\n%s\n' "$1" >&9; }  # the byte 0xff ends what QEMU may have received before
monitor() { qmp "{\"execute\":\"human-monitor-command\",\"arguments\":{\"command-line\":\"$1\"}}"; }
# As a time service does when it has set the clock: adjtimex with the modes ADJ_STATUS and ADJ_MAXERROR, and without STA_UNSYNC.
synchronise_clock() { perl -e '$t = pack("L x4 q q q q l x4 x160", 0x14, 0, 0, 1000, 0, 0); syscall(159, $t) == 0 or die "adjtimex: $!"'; }
sensor_limit() {
  for chip in /sys/class/hwmon/*; do [ "$(cat "$chip/name")" != lm75 ] || echo "$1" > "$chip/temp1_max"; done
}

hostname faults
# A mirror of two disks with a file system, and a bond of two ports.
await has_disk
mdadm --create /dev/md0 --run --level=1 --raid-devices=2 --metadata=1.2 --assume-clean /dev/vda "$(disk)"
mkfs.ext4 -q /dev/md0
mkdir -p /data
mount /dev/md0 /data
ip link del bond0  # the module makes one of another mode
ip link add bond0 type bond mode active-backup miimon 100
for port in eth0 eth1; do ip link set "$port" master bond0; done
ip link set bond0 up
ip addr add 192.0.2.10/24 dev bond0

stty -F /dev/ttyS2 115200 raw -echo
exec 9<> /dev/ttyS2
qmp '{"execute":"qmp_capabilities"}'
echo 1 > /sys/devices/system/machinecheck/machinecheck0/check_interval  # seconds between looks at corrected errors
insmod "$i2c_stub" chip_addr=0x48
for bus in /sys/bus/i2c/devices/i2c-*; do
  case $(cat "$bus/name") in *stub*) echo lm75 0x48 > "$bus/new_device" ;; esac
done
sensor_limit 80000
mkdir -p /run/groups
mount -t cgroup2 none /run/groups
echo +memory > /run/groups/cgroup.subtree_control
mkdir /run/groups/small
echo 8M > /run/groups/small/memory.max
synchronise_clock
ask healthy
dmesg -c > /out/start.txt

qmp '{"execute":"device_del","arguments":{"id":"member"}}'
await has_no_disk
dd if=/dev/zero of=/data/full bs=1M 2> /out/dd.txt || :
sync  # so that the mirror notices that the member is gone
monitor 'set_link n0 off'
sh -c 'echo $$ > /run/groups/small/cgroup.procs; exec tail /dev/zero' || :
echo '0 2048 error' | dmsetup create --noudevsync broken
dmsetup mknodes
dd if=/dev/mapper/broken of=/dev/null bs=4096 count=1 2> /out/dd.txt || :
monitor 'mce 0 9 0x8c00004000010091 0x0 0x12340000 0x8c'
sensor_limit -5000
date -s 2020-01-01 > /dev/null
sleep 4
ask faults

rm /data/full
sync
mdadm /dev/md0 --remove detached || mdadm /dev/md0 --remove failed
qmp '{"execute":"device_add","arguments":{"driver":"scsi-hd","bus":"scsi.0","drive":"d1","id":"member"}}'
await has_disk
mdadm /dev/md0 --add "$(disk)"
monitor 'set_link n0 on'
dmsetup remove --noudevsync broken
sensor_limit 80000
hwclock -s
synchronise_clock
mdadm --wait /dev/md0 || :
sleep 2
dmesg -c > /out/messages.txt
ask mended
