# SPDX-License-Identifier: Apache-2.0
"""The facts of lspci and lsblk, and those of lshw about devices."""
from compare.zep import listed


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
