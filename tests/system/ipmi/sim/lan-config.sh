#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# The LAN parameters of the simulated controller, which ipmi_sim gets from a program (lan_config_program in lan.conf).
#
#   lan-config.sh get NAME...    prints NAME:VALUE for each
set -eu
[ "$1" = get ] || exit 1
shift
for name in "$@"; do
  case $name in
    ip_addr) value=192.0.2.7 ;;
    ip_addr_src) value=static ;;
    subnet_mask) value=255.255.255.0 ;;
    mac_addr) value=52:54:00:a1:b2:c3 ;;
    default_gw_ip_addr) value=192.0.2.1 ;;
    default_gw_mac_addr) value=52:54:00:00:00:01 ;;
    backup_gw_ip_addr) value=0.0.0.0 ;;
    backup_gw_mac_addr) value=00:00:00:00:00:00 ;;
    *) exit 1 ;;
  esac
  echo "$name:$value"
done
