#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# The same server with faults: one member of the mirror failed, one port of the bond is down, a file system is nearly full, and
# a unit of systemd failed.
set -eu
. "${0%/*}/server.sh"
hostname degraded
echo degraded > /etc/hostname
mdadm /dev/md0 --fail "$(part "$virtio" 1)"
ip link set "$second" down
dd if=/dev/zero of=/data/full bs=1M 2>/dev/null || :
sleep 1

# systemd must be the first process, so it gets a process namespace of its own, and it answers only processes in there.
mkdir -p /etc/systemd/system
mount -t cgroup2 none /sys/fs/cgroup
printf '[Unit]\nDefaultDependencies=no\n' > /etc/systemd/system/default.target
printf '[Unit]\nDefaultDependencies=no\n[Service]\nType=oneshot\nExecStart=/bin/sh -c "exit 3"\n' > /etc/systemd/system/backup.service
container=other unshare --pid --fork --mount-proc /lib/systemd/systemd > /dev/null 2>&1 &
for _ in $(seq 60); do [ ! -S /run/systemd/private ] || break; sleep 1; done
systemctl=$(command -v systemctl)
mv "$systemctl" "$systemctl.program"
printf '#!/bin/sh\nexec nsenter -t %s -p -m %s "$@"\n' "$(pidof systemd)" "$systemctl.program" > "$systemctl"
chmod +x "$systemctl"
systemctl start backup.service 2>&1 || :
systemctl --failed --no-pager
