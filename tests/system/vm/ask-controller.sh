#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Describes the management controller of this virtual machine with zep and with ipmitool, and plants faults in it. Runs inside the
# machine of local-controller.sh.
#
#   ask-controller.sh ZEP
#
# Leaves in /out the JSON documents of `zep report` and the output of ipmitool.
set -eu
zep=$1
cd /tmp

ask() {  # ask NAME: writes the report
  "$zep" report --json --plugin-timeout 120 > "/out/$1.json" 2> "/out/$1.err" || [ $? = 2 ]
}
raw() { ipmitool raw "$@" > /dev/null; }
reading() { raw 0x04 0x30 "$1" 0x01 "$2"; }  # reading SENSOR RAW
event() { raw 0x0a 0x44 0 0 2 0 0 0 0 0x20 0 4 "$@"; }  # event TYPE SENSOR DIRECTION-AND-TYPE DATA1 DATA2 DATA3
# Sets the clock to seconds since 1970. QEMU adds the difference between its own time and the one that it is given.
controller_clock() {
  value=$((2 * $(date +%s) - $1))
  raw 0x0a 0x49 $((value & 255)) $((value >> 8 & 255)) $((value >> 16 & 255)) $((value >> 24 & 255))
}

reading 1 70
reading 2 45
reading 3 200
reading 4 0xfb
controller_clock "$(date +%s)"
ask healthy

event 1 1 1 0x59 91 90
event 1 1 0x81 0x57 79 80
event 2 3 1 0x59 0xe2 0xe1
event 8 5 0x6f 1 0xff 0xff
event 0x0c 0x99 0x6f 0 0xff 0xff
event 0x0c 0x99 0x6f 1 0xff 0xff  # does not end by itself
ipmitool -v sdr list all > /out/sdr.txt
ipmitool sel elist > /out/sel.txt
ipmitool fru print 0 > /out/fru.txt
ipmitool mc info > /out/mc.txt
ask compared

for number in $(seq 1 130); do echo 'raw 0x0a 0x44 0 0 2 0 0 0 0 0x20 0 4 0x0c 0x99 0x6f 0 0xff 0xff'; done > many
ipmitool exec many > /out/many.txt 2>&1 || :  # the last ones are refused
controller_clock 5
ask faults

controller_clock "$(date +%s)"
ipmitool sel clear > /out/clear.txt
ask mended
