# SPDX-License-Identifier: Apache-2.0
"""The facts of lspci and lsblk, and those of lshw about devices."""
import re

from compare.zep import listed


def facts_of_lspci(text):
    for block in text.strip().split("\n\n"):
        fields = [line.split(":\t", 1) for line in block.splitlines()]
        address = dict(fields)["Slot"]
        device = dict(fields).get("Device", "")
        for fact, value in fields[1:]:
            if fact == "Rev":
                value = int(value, 16)
            if fact == "PhySlot":
                value = f"PCI slot {value}"
            if fact == "Device":
                value = f"{dict(fields)['Vendor']} {device}"
            yield [address], fact, value


# For a partition, lsblk repeats these facts of its disk.
OF_DISK = ("ra", "sched", "zoned", "rq-size", "disc-max", "wwn", "tran", "dax", "disc-zero", "rand", "rota", "rm", "wsame")


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
            elif isinstance(value, list):
                for part in value:
                    yield names, fact, part
            else:
                yield names + ([device["pkname"]] if fact in OF_DISK else []), fact, value

    for device in document["blockdevices"]:
        if not device["name"].startswith("loop"):
            yield from visit(device)


def lshw_version(bus, text):
    """A revision of a PCI device and a release of a USB device are numbers for zep."""
    if bus == "pci" and re.fullmatch("[0-9a-f]{2}", text):
        return "revision", int(text, 16)
    if bus == "usb" and re.fullmatch(r"[0-9a-f]+\.[0-9a-f]{2}", text):
        return "release", int(text.replace(".", ""), 16)
    return "version", text


def facts_of_lshw(node, wanted):
    """Of the nodes whose class is wanted, and which have a name of the kernel or an address of a bus."""
    logical = listed(node.get("logicalname") or [])
    names = [name.split("/")[-1] for name in logical]
    bus, _, address = node.get("businfo", "").partition("@")
    if bus == "pci":
        names.append(address)
    if bus == "usb":
        names.append(address.replace(":", "-"))
    if names and wanted(node["class"]) and not node.get("handle", "").startswith("DMI:"):
        for fact in ("description", "product", "vendor", "serial", "size", "capacity", "width", "clock"):
            yield names, fact, node.get(fact)
        yield names, *lshw_version(bus, node.get("version", ""))
        for fact, value in node.get("configuration", {}).items():
            yield names, f"configuration.{fact}", value
        for fact in node.get("capabilities", {}):
            yield names, f"capabilities.{fact}", fact
    for child in node.get("children", []):
        yield from facts_of_lshw(child, wanted)
