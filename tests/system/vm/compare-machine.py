#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Compares zep's description of a machine with those of other tools.

    compare-machine.py DIRECTORY    exit status: 0 if every fact is described or has a listed reason, otherwise 1

DIRECTORY has the outputs that ask-tools.sh writes. A fact of another tool is the value of one property of one object: the
serial number of sda. It is described if zep has the value in an instance that names the object in one of its keys, as the
references of an association do. compare/reasons.py lists the facts that zep does not describe in that way, each with the reason.
"""
import json
import re
import sys
from collections import Counter
from pathlib import Path

from compare.devices import facts_of_lsblk, facts_of_lshw, facts_of_lspci
from compare.disks import facts_of_smartctl, missing_while_suspended
from compare.firmware import facts_of_dmidecode, facts_of_lshw_firmware
from compare.ports import facts_of_ethtool, facts_of_ip
from compare.processors import facts_of_lscpu
from compare.reasons import has_reason
from compare.zep import Zep


class Outputs:
    """The outputs of the tools."""

    def __init__(self, directory):
        self.directory = directory

    def text(self, name):
        return (self.directory / name).read_text()

    def json(self, name):
        return json.loads(self.text(name))

    def each(self, pattern):
        """The names of the files of this pattern, each with the part of the name that the group matches."""
        names = sorted(path.name for path in self.directory.iterdir())
        return [(name, match[1]) for name in names if (match := re.fullmatch(pattern, name))]


def facts_of_all(outputs, system):
    """Of each tool: its name, then the facts."""
    yield "lspci", facts_of_lspci(outputs.text("lspci.txt"))
    yield "lsblk", facts_of_lsblk(outputs.json("lsblk.json"))
    yield "lshw", facts_of_lshw(outputs.json("lshw.json"))
    yield "lshw", facts_of_lshw_firmware(outputs.json("lshw.json"), outputs.text("dmidecode.txt"), system)
    yield "ip", facts_of_ip(outputs.json("ip-addr.json"))
    yield "lscpu", facts_of_lscpu(outputs.json("lscpu.json"))
    yield "dmidecode", facts_of_dmidecode(outputs.text("dmidecode.txt"), system)
    for name, disk in outputs.each(r"smartctl-(\w+)\.json"):
        yield "smartctl", facts_of_smartctl(disk, outputs.json(name))
    for name, port in outputs.each(r"ethtool-(?:\w+-)?(\w+)\.txt"):
        yield "ethtool", facts_of_ethtool(port, outputs.text(name))


def main():
    outputs = Outputs(Path(sys.argv[1]))
    zep = Zep(outputs.json("zep.json"))
    missing, counts = [], {}
    for tool, facts in facts_of_all(outputs, zep.system):
        count = counts.setdefault(tool, Counter())
        for names, fact, value in facts:
            if value is None or str(value).strip() == "":
                continue
            described = zep.describes(names, value)
            result = "described" if described else "with a reason" if has_reason(tool, fact, names[0]) else "missing"
            count[result] += 1
            if result == "missing":
                missing.append(f"{tool}: {fact} of {names[0]} is {value!r}")
    missing += missing_while_suspended(outputs.json("zep.json"), outputs.json("zep-suspended.json"))
    print(f"zep: {zep.count} facts")
    for tool, count in counts.items():
        print(f"{tool}: {sum(count.values())} facts, " + ", ".join(f"{number} {name}" for name, number in count.items()))
    print("\n".join(missing))
    return 1 if missing else 0


sys.exit(main())
