#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Compares zep's description of a machine with those of other tools.

    compare-machine.py DIRECTORY    exit status: 0 if every fact is described or has a listed reason, otherwise 1

DIRECTORY has the outputs that ask-tools.sh writes. A fact of another tool is the value of one property of one object: the
serial number of sda. It is described if zep has the value in an instance that names the object in one of its keys, as the
references of an association do. REASONS lists the facts that zep does not describe in that way, each with the reason.
"""
import json
import re
import sys
from collections import Counter
from pathlib import Path

# By tool, fact and object, which is a regular expression.
REASONS = {
    ("lspci", "SVendor", r".*"): "the name of a subsystem includes its vendor where the list of identifiers has one",
    ("lspci", "SDevice", r".*"): "without a name for the subsystem, lspci repeats that of the device",
    ("lsblk", "size", r"fd0"): "the kernel reports 4 KiB for a floppy drive without a disk",
    ("lsblk", "state", r"dm-\d"): "lsblk calls an active map running",
    ("lsblk", "group", r".*"): "who may open the node is not a fact of the device",
    ("lsblk", "owner", r".*"): "who may open the node is not a fact of the device",
    ("lsblk", "mode", r".*"): "who may open the node is not a fact of the device",
    ("lsblk", "kname", r".*"): "it is the key",
    ("lsblk", "pkname", r".*"): "an association leads to the disk",
    ("lsblk", "subsystems", r".*"): "associations lead to the controller and its bus",
    ("lsblk", "type", r".*"): "it is the class",
    ("lsblk", "fsuse%", r".*"): "it follows from the size and the free space",
    ("lsblk", "fsused", r".*"): "it follows from the size and the free space",
    ("lsblk", "fsroots", r".*"): "only the roots that are mounted are described",
    ("lsblk", "parttypename", r".*"): "the type itself is described; its name is lsblk's",
    ("lsblk", "vendor", r"sda\d?|vda\d?"): "lsblk gives the bus of a SATA disk and the number of the vendor of a virtio disk",
    ("lsblk", "path", r"dm-\d"): "the node of a map below /dev/mapper bears the name of the map, which is described",
    ("lsblk", "tran", r"sdb|sr0"): "the schema calls the bus of parallel SCSI by another name",
    ("lshw", "product", r"input\d+|nvme0"): "lshw puts the maker in front of the product of a USB device, and describes input devices",
    ("lshw", "vendor", r"sd[a-z]\d?|nvme0n1p\d|mmcblk0"): "lshw gives the program that made the file system, or the number of a maker",
    ("lshw", "size", r"sd[a-z]\d?|nvme0n1p\d"): "lshw gives the size of the file system that its own probe computes",
    ("lshw", "capacity", r"(nvme0n1p|vda)\d"): "lshw gives one block less than the partition has",
    ("lshw", "serial", r"mmcblk0|nvme0"): "lshw prints the number of an SD card in decimal digits",
    ("lshw", "configuration.speed", r".*"): "lshw shortens the number",
    ("lshw", "configuration.ansiversion", r".*"): "the version of the command set is not described",
    ("lshw", "configuration.filesystem", r".*"): "lshw's own name for the type",
    ("lshw", "configuration.state", r".*"): "lshw's own word for what the mounts and the type say",
    ("lshw", "configuration.status", r".*"): "lshw's own word: whether a drive has a medium",
    ("lshw", "configuration.mount.options", r".*"): "the options of the mount and of the file system are two properties",
    ("lshw", "configuration.created", r".*"): "times inside the file system are not described",
    ("lshw", "configuration.modified", r".*"): "times inside the file system are not described",
    ("lshw", "configuration.nqn", r".*"): "the name of the NVMe subsystem is not described",
    ("lshw", "configuration.wwid", r".*"): "it is described without the prefix nvme.",
    ("lshw", "configuration.autonegotiation", r".*"): "lshw's word for AutoSense",
    ("lshw", "configuration.duplex", r".*"): "lshw's word for FullDuplex",
    ("lshw", "configuration.driverversion", r".*"): "the version of the kernel, for a driver that is part of it",
    ("lshw", "configuration.broadcast", r".*"): "lshw's word for a flag of the interface",
    ("lshw", "configuration.multicast", r".*"): "lshw's word for a flag of the interface",
    ("lshw", "configuration.link", r".*"): "lshw's word for the operational status",
    ("lshw", "configuration.slave", r".*"): "lshw's word for membership in a bond",
    ("ip", "tso_max_size", r".*"): "limits of segmentation offload are not described",
    ("ip", "tso_max_segs", r".*"): "limits of segmentation offload are not described",
    ("ip", "gso_max_size", r".*"): "limits of segmentation offload are not described",
    ("ip", "gso_max_segs", r".*"): "limits of segmentation offload are not described",
    ("ip", "gro_max_size", r".*"): "limits of segmentation offload are not described",
    ("ip", "address", r"lo"): "an address of zeros is a missing value with a reason",
    ("ip", "broadcast", r"lo"): "an address of zeros is a missing value with a reason",
    ("ip", "group", r".*"): "a label of the administrator, not of the interface",
    ("ip", "parentbus", r".*"): "the device is described with its bus",
}


def normalised(value):
    """Texts without case, outer blanks, colons of MAC addresses and the prefix of hexadecimal numbers."""
    text = str(value).strip().lower()
    if re.fullmatch(r"([0-9a-f]{2}:)+[0-9a-f]{2}", text):
        text = text.replace(":", "")
    return text[2:] if text.startswith("0x") else text


def listed(value):
    return value if isinstance(value, list) else [value]


class Zep:
    """The values of all instances, by the names that their keys contain."""

    def __init__(self, document):
        self.values = {}
        self.count = 0
        for instance in document["instances"]:
            if instance["class"] == "ZEP_MissingValue":
                continue
            names, values = set(), set()
            properties = instance["properties"]
            for name, entry in properties.items():
                found = [value for value in listed(entry["value"]) + listed(entry.get("words")) if value is not None]
                self.count += bool(found) and not entry.get("key", False)
                for value in found:
                    values.add(normalised(value))
                    if entry.get("key") and name not in ("SystemName", "SystemCreationClassName", "CreationClassName"):
                        words = [str(value), *re.split(r'[ /"]|(?<!\d):', str(value))]
                        names.update(words)
                        values.update(normalised(word) for word in words)
            values.update(self.sizes(properties))
            for name in names:
                self.values.setdefault(name, set()).update(values)

    @staticmethod
    def sizes(properties):
        """The sizes in bytes that are described as a number of blocks."""
        block, number = (properties.get(name, {}).get("value") for name in ("BlockSize", "NumberOfBlocks"))
        return {str(int(block) * int(number))} if block and number else set()

    def describes(self, names, value):
        return any(normalised(value) in self.values.get(name, ()) for name in names)


def facts_of_lspci(text):
    for block in text.strip().split("\n\n"):
        fields = [line.split(":\t", 1) for line in block.splitlines()]
        address = dict(fields)["Slot"]
        device = dict(fields).get("Device", "")
        for fact, value in fields[1:]:
            if fact == "Rev":
                value = int(value, 16)
            if fact == "Device":
                value = f"{dict(fields)['Vendor']} {device}"
            if fact not in ("NUMANode", "IOMMUGroup"):
                yield [address], fact, value


# For a partition, lsblk repeats these facts of its disk.
OF_DISK = ("ra", "sched", "zoned", "rq-size", "disc-max", "wwn", "tran")


def facts_of_lsblk(document):
    def visit(device):
        names = [device["kname"]]
        for fact, value in device.items():
            if fact == "children":
                for child in value:
                    yield from visit(child)
            elif fact == "start" and value is not None:
                yield names, fact, value * 512
            elif fact == "ra":
                yield names + [device["pkname"]], fact, value * 1024
            elif fact == "wwn" and value is not None:
                yield names + [device["pkname"]], fact, value.split(".", 1)[-1]
            elif fact == "mountpoints":
                for point in value:
                    yield names, fact, point
            elif not isinstance(value, (list, bool)):
                yield names + ([device["pkname"]] if fact in OF_DISK else []), fact, value

    for device in document["blockdevices"]:
        if not device["name"].startswith("loop"):
            yield from visit(device)


def facts_of_ip(links):
    for link in links:
        name = [link["ifname"]]
        for fact, value in link.items():
            if isinstance(value, (str, int)) and not isinstance(value, bool):
                yield name, fact, value
        for flag in link["flags"]:
            yield name, "flags", flag
        for address in link["addr_info"]:
            yield name, "local", address["local"]
            if address["family"] == "inet6":
                yield name, "prefixlen", address["prefixlen"]
            yield name, "scope", address["scope"]


def facts_of_lshw(node):
    """Of devices and their media only: those with a name of the kernel or an address of a bus."""
    logical = listed(node.get("logicalname") or [])
    names = [name.split("/")[-1] for name in logical]
    bus, _, address = node.get("businfo", "").partition("@")
    if bus == "pci":
        names.append(address)
    if bus == "usb":
        names.append(address.replace(":", "-"))
    if names and node.get("class") in ("bridge", "bus", "disk", "input", "network", "storage", "volume"):
        for fact in ("product", "vendor", "serial", "size", "capacity"):
            yield names, fact, node.get(fact)
        for fact, value in node.get("configuration", {}).items():
            yield names, f"configuration.{fact}", value
    for child in node.get("children", []):
        yield from facts_of_lshw(child)


def has_reason(tool, fact, name):
    return any((tool, fact) == key[:2] and re.fullmatch(key[2], name) for key in REASONS)


def main():
    directory = Path(sys.argv[1])
    zep = Zep(json.loads((directory / "zep.json").read_text()))
    tools = {
        "lspci": facts_of_lspci((directory / "lspci.txt").read_text()),
        "lsblk": facts_of_lsblk(json.loads((directory / "lsblk.json").read_text())),
        "lshw": facts_of_lshw(json.loads((directory / "lshw.json").read_text())),
        "ip": facts_of_ip(json.loads((directory / "ip-addr.json").read_text())),
    }
    missing, counts = [], {tool: Counter() for tool in tools}
    for tool, facts in tools.items():
        for names, fact, value in facts:
            if value is None or str(value).strip() == "":
                continue
            described = zep.describes(names, value)
            result = "described" if described else "with a reason" if has_reason(tool, fact, names[0]) else "missing"
            counts[tool][result] += 1
            if result == "missing":
                missing.append(f"{tool}: {fact} of {names[0]} is {value!r}")
    print(f"zep: {zep.count} facts")
    for tool, count in counts.items():
        print(f"{tool}: {sum(count.values())} facts, " + ", ".join(f"{number} {name}" for name, number in count.items()))
    print("\n".join(missing))
    return 1 if missing else 0


sys.exit(main())
