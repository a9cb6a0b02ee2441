#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Writes the SMBIOS structures of the virtual server of server-vm.sh, and prints the options of QEMU that use them.

    server-smbios.py DIRECTORY

Each structure is a file of its own, as QEMU's option -smbios file= expects. QEMU makes the structures of types 0, 1, 19, 32 and
38 by itself.
"""
import struct
import sys
from pathlib import Path


class Structure:
    """A structure: its fields after the header, and its strings."""

    def __init__(self, kind, handle):
        self.kind, self.handle, self.fields, self.strings = kind, handle, b"", []

    def number(self, size, *values):
        """Appends whole numbers of `size` bytes."""
        for value in values:
            self.fields += value.to_bytes(size, "little")
        return self

    def text(self, value):
        """Appends the number of a string, 0 for no string."""
        if value:
            self.strings.append(value)
        return self.number(1, len(self.strings) if value else 0)

    def bytes(self):
        header = struct.pack("<BBH", self.kind, 4 + len(self.fields), self.handle)
        strings = b"".join(text.encode() + b"\0" for text in self.strings) or b"\0"
        return header + self.fields + strings + b"\0"


MAKER = "Example Works"
BOARD, CHASSIS, ARRAY, CACHES = 0x0200, 0x0300, 0x1000, 0x0700


def board():
    structure = Structure(2, BOARD).text(MAKER).text("Q100 Planar").text("02").text("BRD0042").text("RACK5-B")
    return structure.number(1, 0x09).text("Behind the fans").number(2, CHASSIS).number(1, 10, 0)


def chassis():
    structure = Structure(3, CHASSIS).text(MAKER).number(1, 23).text("A3").text("CHS0007").text("RACK5-C")
    structure.number(1, 3, 3, 3, 3).number(4, 0).number(1, 2, 2, 0, 0)
    return structure.text("1234AB7")


def processor(socket):
    structure = Structure(4, 0x0400 + socket).text(f"CPU {socket}").number(1, 3, 0xB3).text(MAKER)
    structure.number(8, 0x0FCBFBFD00000FB1).text("Example Processor 4410").number(1, 0x8C).number(2, 100, 4000, 2600)
    structure.number(1, 0x41, 0x3D).number(2, *(CACHES + 3 * socket + level for level in range(3)))
    structure.text(f"PS{socket:04}").text(f"RACK5-P{socket}").text("PP-4410").number(1, 2, 2, 2).number(2, 0xFC, 0xB3, 2, 2, 2)
    return structure


def cache(socket, level):
    """A cache of 32, 1024 or 16384 KiB."""
    size, error, kind, ways = ((32, 4, 5, 7), (1024, 5, 5, 7), (16384, 6, 5, 8))[level]
    structure = Structure(7, CACHES + 3 * socket + level).text(f"L{level + 1} Cache {socket}").number(2, 0x0180 + level, size, size)
    return structure.number(2, 0x20, 0x20).number(1, 0, error, kind, ways)


def slot(number, kind, width, used, bus, device):
    structure = Structure(9, 0x0900 + number).text(f"PCIe {number + 1}").number(1, kind, width, 4 if used else 3, 4)
    return structure.number(2, number + 1).number(1, 0x0C, 0x01).number(2, 0).number(1, bus, device << 3)


def texts(kind, handle, *values):
    structure = Structure(kind, handle).number(1, len(values))
    structure.strings = list(values)
    return structure


def memory_array():
    structure = Structure(16, ARRAY).number(1, 3, 3, 6).number(4, 0x80000000).number(2, 0xFFFE, 8)
    return structure.number(8, 2 << 40)


def memory_module(number):
    """128 MiB of DDR4 with ECC; each processor has four modules. The last one keeps its contents (NVDIMM-N)."""
    structure = Structure(17, 0x1100 + number).number(2, ARRAY, 0xFFFE, 72, 64, 128).number(1, 9, 0)
    structure.text(f"DIMM {number}").text(f"P{number // 4} channel {number % 4}").number(1, 0x1A).number(2, 0x2080, 3200)
    structure.text("Example Memory").text(f"MS{number:06}").text(f"RACK5-M{number}").text("EM4-3200-128").number(1, 2)
    structure.number(4, 0).number(2, 2933, 1200, 1200, 1200)
    keeps, size = number == 7, 128 << 20
    structure.number(1, 4 if keeps else 3).number(2, 0x18 if keeps else 0x08).text("NV 1.2" if keeps else "")
    structure.number(2, 0x2C80, 0x4410, 0x2C80 if keeps else 0, 0x0012 if keeps else 0)
    return structure.number(8, size if keeps else 0, size, 0, size if keeps else 0)


def trusted_platform_module():
    structure = Structure(43, 0x2B00)
    structure.fields = b"EXM\0"
    return structure.number(1, 2, 0).number(4, 7 << 16 | 62, 0).text("Example TPM").number(8, 1 << 3).number(4, 0)


def onboard_device(number, name, kind, bus, device):
    return Structure(41, 0x2900 + number).text(name).number(1, 0x80 | kind, number + 1).number(2, 0).number(1, bus, device << 3)


def structures():
    yield board()
    yield chassis()
    for socket in range(2):
        yield processor(socket)
        for level in range(3):
            yield cache(socket, level)
    yield slot(0, 0xB6, 13, True, 0, 4)
    yield slot(1, 0xA5, 10, False, 0, 31)
    yield texts(11, 0x0B00, "Example firmware build 7", "Support line 5", "Delivered 2023-05")
    yield texts(12, 0x0C00, "J1: clears the settings of the firmware", "J2: enables the recovery image")
    yield memory_array()
    for number in range(8):
        yield memory_module(number)
    yield onboard_device(0, "Management Graphics", 3, 0, 1)
    yield onboard_device(1, "SATA Controller", 9, 0, 31)
    yield trusted_platform_module()


def main():
    directory = Path(sys.argv[1])
    options = ["-smbios type=0,vendor=Example-Firmware,date=05/17/2023,release=1.10",
               "-smbios type=1,version=R2,sku=1234AB7CTO,family=Q-Servers,uuid=3f2a9c54-11d0-4b8e-9a7e-52540011aa01"]
    for structure in structures():
        path = directory / f"type{structure.kind}-{structure.handle:04x}"
        path.write_bytes(structure.bytes())
        options.append(f"-smbios file={path}")
    print(" ".join(options))


main()
