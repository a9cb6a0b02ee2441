#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Copies the files that describe this machine to /out/tree. Runs inside the virtual machine of record-machine.sh.
#
#   record-files.sh ZEP
zep=$1
tree=/out/tree
mkdir -p $tree/sys $tree/proc/sys/kernel $tree/proc/self $tree/proc/net $tree/etc $tree/run

# cp reads each file to its end, whatever size sysfs reports. Some attributes cannot be read, which is not an error here.
for directory in block bus/pci bus/usb bus/scsi bus/node class dev devices firmware/dmi firmware/efi firmware/acpi/tables; do
  [ -e /sys/$directory ] || continue
  mkdir -p $tree/sys/$directory
  cp -a /sys/$directory/. $tree/sys/$directory/ 2>/dev/null
done
# These say nothing about the hardware, and are many.
(
  cd $tree/sys
  find . -depth -type d \( -name power -o -name cpuidle -o -name tracing -o -name msi_irqs -o -name wakeup \) -exec rm -rf {} \;
  rm -rf devices/virtual/tty devices/virtual/vc devices/virtual/vtconsole devices/virtual/mem devices/virtual/workqueue \
    devices/virtual/misc devices/virtual/bdi devices/virtual/input devices/platform/serial8250 devices/pnp0 devices/software \
    devices/tracepoint devices/breakpoint devices/kprobe devices/uprobe devices/msr devices/virtual/graphics class/tty class/vc \
    class/mem class/misc class/bdi class/input class/wakeup class/workqueue class/graphics class/vtconsole dev/char \
    devices/system/clockevents devices/system/clocksource devices/system/machinecheck devices/system/container \
    devices/system/memory devices/LNXSYSTM:00
  find . -type f -name 'resource*' -exec rm -f {} \;
  find . -type f -name 'rom' -exec rm -f {} \;
  find . -type f -size +64k -exec rm -f {} \;
)
for file in cpuinfo meminfo swaps mdstat uptime loadavg cmdline version stat partitions diskstats modules mounts \
  self/mountinfo net/dev net/route net/ipv6_route net/if_inet6 net/fib_trie \
  sys/kernel/arch sys/kernel/hostname sys/kernel/osrelease sys/kernel/ostype sys/kernel/version sys/kernel/tainted; do
  cat /proc/$file > $tree/proc/$file 2>/dev/null || rm -f $tree/proc/$file
done
for directory in net/bonding net/vlan; do
  [ ! -e /proc/$directory ] || cp -a /proc/$directory $tree/proc/net/ 2>/dev/null
done
for file in os-release resolv.conf hostname fstab; do [ ! -e /etc/$file ] || cp -L /etc/$file $tree/etc/; done
mkdir -p $tree/run/udev
[ ! -e /run/udev/data ] || cp -a /run/udev/data $tree/run/udev/
mkdir $tree/dev
timeout 2 cat /dev/kmsg > $tree/dev/kmsg  # it ends only with a signal
ZEP_RECORD_ANSWERS=$tree $zep report --json --plugin-timeout 120 > /out/report.json 2> /out/report.err
echo "zep report ended with status $?"
exit 0
