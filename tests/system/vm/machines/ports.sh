#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# The ports of the recorded servers: a bond of two ports, and a bridge above a VLAN of the bond.
port() {  # port MAC: the name of the port
  for net in /sys/class/net/*; do
    if [ -e "$net/device" ] && [ "$(cat "$net/address")" = "$1" ]; then echo "${net##*/}"; return; fi
  done
  echo "no port $1" >&2
  exit 1
}
first=$(port 52:54:00:11:22:01) second=$(port 52:54:00:11:22:02)
ip link del bond0  # the module makes one of another mode
ip link add bond0 type bond mode active-backup miimon 100
ip link set "$first" master bond0
ip link set "$second" master bond0
ip link set bond0 up
ip link add link bond0 name bond0.10 type vlan id 10
ip link add br0 type bridge
ip link set bond0.10 master br0
ip link set bond0.10 up
ip link set br0 up
ip addr add 192.0.2.10/24 dev bond0
ip addr add 198.51.100.1/25 dev br0
ip addr add 2001:db8::10/64 dev bond0
ip route add default via 192.0.2.1
ip route add 203.0.113.0/24 via 198.51.100.2 metric 20
printf 'search example.org\nnameserver 192.0.2.53\nnameserver 2001:db8::53\n' > /etc/resolv.conf
sleep 3
