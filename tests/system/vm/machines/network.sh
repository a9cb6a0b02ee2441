#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# A server with a varied network: the bond, VLAN and bridge of the other servers, bonds with LACP, further names, a VLAN of another
# protocol, and addresses and routes of every kind.
set -eu
hostname network
. "${0%/*}/ports.sh"
ip link property add dev "$first" altname uplink-a
ip link set "$first" alias 'rack 5, switch 2'
ip link add link br0 name br0.20 type vlan proto 802.1ad id 20
ip link set br0.20 up
ip addr add 192.0.2.20/24 dev bond0 valid_lft 3600 preferred_lft 1800
ip addr add 203.0.113.1 peer 203.0.113.2 dev br0.20
ip addr add 2001:db8:20::20/64 dev br0.20 valid_lft 7200 preferred_lft 3600
ip route add 233.252.0.0/24 nexthop via 192.0.2.2 weight 1 nexthop via 198.51.100.3 weight 2
ip route add 198.18.0.0/15 via 192.0.2.3 proto bgp metric 70000
ip route add unreachable 192.0.2.128/25
ip -6 route add default via 2001:db8::1 metric 2000
printf 'options ndots:2 timeout:1\n' >> /etc/resolv.conf
# Two bonds with LACP are each other's partners.
ip link add port-a type veth peer name port-b
for end in a b; do
  ip link add "lacp-$end" type bond mode 802.3ad miimon 100 lacp_rate fast xmit_hash_policy layer3+4
  ip link set "port-$end" master "lacp-$end"
  ip link set "lacp-$end" up
done
sleep 6
