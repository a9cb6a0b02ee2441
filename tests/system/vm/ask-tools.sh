#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Lets zep and other tools describe this machine, with their outputs in /out. Runs inside the virtual machine of
# compare-machine.sh.
#
#   ask-tools.sh ZEP
zep=$1
cd /out || exit
"$zep" report --json --plugin-timeout 120 > zep.json 2> zep.err
lshw -json -quiet > lshw.json 2> lshw.err
lspci -D -vmm -k > lspci.txt
lsblk -J -O -b > lsblk.json
lscpu -J > lscpu.json
ip -j -d addr > ip-addr.json
ip -j route > ip-route.json
dmidecode > dmidecode.txt 2> dmidecode.err
for disk in /dev/sda /dev/nvme0n1; do smartctl --json -x "$disk" > "smartctl-${disk##*/}.json"; done
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
