#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Lets zep and other tools describe this machine, with their outputs in /out. Runs inside the virtual machine of
# compare-machine.sh.
#
#   ask-tools.sh ZEP
zep=$1
cd /out || exit

# Its processor time is in NAME.time, and the memory of all its processes together in NAME.memory. One processor, because QEMU
# spends much time on several when it translates.
measured() {  # measured NAME COMMAND...
  name=$1
  shift
  mkdir "/sys/fs/cgroup/$name"
  sh -c 'echo $$ > "/sys/fs/cgroup/$0/cgroup.procs" && exec busybox time -v -o "$0.time" taskset 1 "$@"' "$name" "$@"
  cat "/sys/fs/cgroup/$name/memory.peak" > "$name.memory"
}
mount -t cgroup2 none /sys/fs/cgroup 2> /dev/null  # the machine may have done so
echo +memory > /sys/fs/cgroup/cgroup.subtree_control

measured zep "$zep" report --json --plugin-timeout 120 > zep.json 2> zep.err
measured lshw lshw -json -quiet > lshw.json 2> lshw.err
lspci -D -vmm -k > lspci.txt
lsblk -J -O -b > lsblk.json
lscpu -J > lscpu.json
ip -j -d addr > ip-addr.json
ip -j -d route > ip-route.json
ip -j -d -6 route > ip-route6.json
cp /etc/resolv.conf resolv.conf
dmidecode > dmidecode.txt 2> dmidecode.err
for disk in /dev/sda /dev/nvme0n1; do smartctl --json -x "$disk" > "smartctl-${disk##*/}.json"; done
mdadm --detail /dev/md0 > mdadm-detail-md0.txt
mdadm --detail --export /dev/md0 > mdadm-export-md0.txt
for port in /sys/class/net/*; do
  [ -e "$port/device" ] || continue
  ethtool "${port##*/}" > "ethtool-${port##*/}.txt"
  ethtool -i "${port##*/}" > "ethtool-driver-${port##*/}.txt"
  ethtool -P "${port##*/}" > "ethtool-address-${port##*/}.txt"
done
# A disk that does not answer: reads from the suspended device block.
dmsetup suspend vg0-spare
timeout 120 "$zep" report --json --plugin-timeout 60 > zep-suspended.json 2> zep-suspended.err
exit 0
