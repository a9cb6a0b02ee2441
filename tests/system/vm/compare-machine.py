#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Compares zep's description of a machine with those of other tools.

    compare-machine.py DIRECTORY    exit status: 0 if every fact is described or has a listed reason, and zep was quick and small
                                    enough, otherwise 1

DIRECTORY has the outputs that ask-tools.sh writes. A fact of another tool is the value of one property of one object: the
serial number of sda. It is described if zep has the value in an instance that names the object in one of its keys, as the
references of an association do. compare/properties.py names the property for values that are too common for that, such as 0.
compare/reasons.py lists the facts that zep does not describe in that way, each with the reason.
"""
import json
import re
import sys
from collections import Counter
from pathlib import Path

from compare.devices import facts_of_lsblk, facts_of_lshw, facts_of_lspci
from compare.disks import facts_of_mdadm, facts_of_mdadm_export, facts_of_smartctl, missing_while_suspended
from compare.firmware import facts_of_dmidecode, facts_of_lshw_firmware
from compare.ports import facts_of_ethtool, facts_of_ip, facts_of_resolvers, facts_of_routes
from compare.processors import facts_of_lscpu
from compare.properties import is_common, properties_of
from compare.reasons import has_reason
from compare.subjects import OF_LSHW, subject_of_fact, table
from compare.use import excess, use_of
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
    """Of each tool: its name, of lshw the class of the facts, and the facts."""
    yield "lspci", None, facts_of_lspci(outputs.text("lspci.txt"))
    yield "lsblk", None, facts_of_lsblk(outputs.json("lsblk.json"))
    for kind in (*OF_LSHW, None):
        wanted = (lambda found: found == kind) if kind else (lambda found: found not in OF_LSHW)
        yield "lshw", kind, facts_of_lshw(outputs.json("lshw.json"), wanted)
    yield "lshw", None, facts_of_lshw_firmware(outputs.json("lshw.json"), outputs.text("dmidecode.txt"), system)
    yield "ip", None, facts_of_ip(outputs.json("ip-addr.json"))
    for name in ("ip-route.json", "ip-route6.json"):
        yield "ip", None, facts_of_routes(outputs.json(name))
    yield "resolv.conf", None, facts_of_resolvers(outputs.text("resolv.conf"))
    yield "mdadm", None, facts_of_mdadm("md0", outputs.text("mdadm-detail-md0.txt"))
    yield "mdadm", None, facts_of_mdadm_export("md0", outputs.text("mdadm-export-md0.txt"))
    yield "lscpu", None, facts_of_lscpu(outputs.json("lscpu.json"))
    yield "dmidecode", None, facts_of_dmidecode(outputs.text("dmidecode.txt"), system)
    for name, disk in outputs.each(r"smartctl-(\w+)\.json"):
        yield "smartctl", None, facts_of_smartctl(disk, outputs.json(name))
    for name, port in outputs.each(r"ethtool-(?:\w+-)?(\w+)\.txt"):
        yield "ethtool", None, facts_of_ethtool(port, outputs.text(name))


def result_of(zep, tool, names, fact, value):
    """"described", "with a reason" or "missing". A common value is only described if it is that of a known property."""
    properties = properties_of(tool, fact)
    if (properties or not is_common(value)) and zep.describes(names, value, properties):
        return "described"
    return "with a reason" if has_reason(tool, fact, names[0]) else "missing"


def compare(outputs, zep):
    """The facts that are missing, and the number of facts by subject, tool and result."""
    missing, results = [], Counter()
    for tool, kind, facts in facts_of_all(outputs, zep.system):
        for names, fact, value in facts:
            if value is None or str(value).strip() == "":
                continue
            result = result_of(zep, tool, names, fact, value)
            results[subject_of_fact(tool, fact, kind), tool, result] += 1
            if result == "missing":
                missing.append(f"{tool}: {fact} of {names[0]} is {value!r}")
    return missing, results


def main():
    outputs = Outputs(Path(sys.argv[1]))
    zep = Zep(outputs.json("zep.json"))
    missing, results = compare(outputs, zep)
    missing += missing_while_suspended(outputs.json("zep.json"), outputs.json("zep-suspended.json"))
    uses = {name: use_of(outputs.text(f"{name}.time"), outputs.text(f"{name}.memory")) for name in ("zep", "lshw")}
    missing += excess(uses["zep"], uses["lshw"])
    print("\n".join(table(zep.counts, results)))
    for name, (seconds, memory) in uses.items():
        print(f"{name}: {seconds:.2f} s of processor time, {memory} bytes of memory")
    print("\n".join(missing))
    return 1 if missing else 0


sys.exit(main())
