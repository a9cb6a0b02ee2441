#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# The same server with faults: one member of the mirror failed, one port of the bond is down, a file system is nearly full.
set -eu
. "${0%/*}/server.sh"
hostname degraded
echo degraded > /etc/hostname
mdadm /dev/md0 --fail "$(part "$virtio" 1)"
ip link set "$second" down
dd if=/dev/zero of=/data/full bs=1M 2>/dev/null || :
sleep 1
