#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
#
# Compares what zep reads from the management controller of a virtual machine (QEMU's ipmi-bmc-sim on KCS), through /dev/ipmi0, with
# what ipmitool reads there, value by value. Then plants faults in the controller, which zep must find, and mends them.
#
#   local-controller.sh BUILD [DIRECTORY]    exit status: 0 if all agrees, otherwise 1; 77 if a program is missing, unless CI is "true"
#
# BUILD is a build tree with zep and the provider plug-ins. DIRECTORY, if given, receives the documents of zep and the texts of
# ipmitool. The controller has no LAN channel, no accounts and no states of sensors; the LAN simulator of tests/system/ipmi has them.
#
# Needs: what run-in-vm.sh needs, and the packages ipmitool, python3.
set -eu
[ $# -ge 1 ] || { sed -n '3,13s/^# \{0,1\}//p' "$0" >&2; exit 2; }
here=$(cd "$(dirname "$0")" && pwd)
build=$(cd "$1" && pwd) outputs=${2:-}
for program in ipmitool python3 qemu-system-x86_64; do
  command -v "$program" >/dev/null && continue
  echo "local-controller.sh: $program is missing" >&2
  [ "${CI:-}" = true ] && exit 1
  exit 77
done
"$here/fetch-kernel.sh" full >/dev/null
work=$(mktemp -d "${TMPDIR:-/tmp}/zep-controller.XXXXXX")
trap 'rm -rf "$work"' EXIT

python3 -B "$here/local-controller.py" make "$here/../ipmi/sim/sensors.emu" "$work"
controller="-device ipmi-bmc-sim,id=bmc,sdrfile=$work/sdr,frudatafile=$work/fru,fwrev1=1,fwrev2=16,mfg_id=4753,product_id=3842"
controller="$controller,guid=12345678-9abc-def0-1234-56789abcdef0 -device isa-ipmi-kcs,bmc=bmc"
status=0
"$here/run-in-vm.sh" --module ipmi_si --module ipmi_devintf --file "$(command -v ipmitool)" --file "$here/ask-controller.sh" \
  --file "$build/bin/zep" --file "$build/lib" --file /etc/os-release --out "$work/out" --timeout 300 --qemu "$controller" \
  sh "$here/ask-controller.sh" "$build/bin/zep" > "$work/output" 2>&1 || status=$?
[ -z "$outputs" ] || { mkdir -p "$outputs"; cp -r "$work/output" "$work/out/." "$outputs/"; }
[ $status = 0 ] || { cat "$work/output" >&2; exit 1; }
python3 -B "$here/local-controller.py" compare "$work/out"
