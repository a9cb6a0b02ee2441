#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Makes smbios.bin, the SMBIOS tables of an invented server, which `zep report --sample` reads.

    make-sample.py [FILE]         default: smbios.bin beside this script

The file is in the form of `dmidecode --dump-bin`: a 64-bit entry point, the table at byte 32. See what is in it with
`dmidecode --from-dump smbios.bin`. The build does not run this script.
"""
import os
import struct
import sys
import uuid

TABLE_OFFSET = 32
MAKER = "Example Works"
END_OF_TABLE = 127


class Structure:
    """One structure: fields are added in the order of the standard, strings by their text."""

    def __init__(self, kind, handle):
        self.kind, self.handle, self.fields, self.strings = kind, handle, b"", []

    def numbers(self, layout, *values):
        self.fields += struct.pack("<" + layout, *values)
        return self

    def text(self, *texts):
        for text in texts:
            if text and text not in self.strings:
                self.strings.append(text)
            self.fields += bytes([self.strings.index(text) + 1 if text else 0])
        return self

    def raw(self, data):
        self.fields += data
        return self

    def oem_strings(self, texts):
        self.strings = list(texts)
        return self.numbers("B", len(texts))

    def packed(self):
        header = struct.pack("<BBH", self.kind, 4 + len(self.fields), self.handle)
        return header + self.fields + b"".join(s.encode() + b"\0" for s in self.strings) + b"\0" * (1 if self.strings else 2)


def bios():
    return (Structure(0, 0x0000).text(MAKER, "-[QAE118B-1.30]-").numbers("H", 0xF000).text("03/14/2024")
            .numbers("BQ", 0xFF, 0x99880).raw(bytes([0x03, 0x0D])).numbers("BBBB", 1, 30, 2, 11).numbers("H", 32))


def system():
    ident = uuid.UUID("6f1d2c3b-4a59-4687-9708-1a2b3c4d5e6f")
    return (Structure(1, 0x0001).text(MAKER, "Server Q100 -[1234AB7]-", "06", "KQ12345").raw(ident.bytes_le)
            .numbers("B", 6).text("1234AB7", "Server Q"))


def board():
    return (Structure(2, 0x0002).text(MAKER, "00QA100", "03", "Y010UF42K00C", "KQ12345-A").numbers("B", 0x09)
            .text("Slot A").numbers("HBB", 0x0003, 0x0A, 0))


def chassis():
    return (Structure(3, 0x0003).text(MAKER).numbers("B", 0x17).text("Rack 2U", "KQ12345", "RACK-07-U21")
            .numbers("BBBBIBBBB", 3, 3, 3, 2, 0, 2, 2, 0, 0).text("1234AB7"))


def processor(socket):
    handle = 0x0010 + socket
    return (Structure(4, handle).text("CPU %d" % (socket + 1)).numbers("BB", 3, 1).text(MAKER)
            .numbers("Q", 0).text("Example Processor P2400 @ 2.40GHz")
            .numbers("BHHHBB", 0x8C, 100, 3600, 2400, 0x41, 1)
            .numbers("HHH", *(0x0020 + 3 * socket + level for level in range(3)))
            .text("%016X" % (0x1A2B3C4D0000 + socket), None, "P2400")
            .numbers("BBBHHHHH", 12, 12, 24, 0x00FC, 1, 12, 12, 24))


def cache(socket, level):
    kilobytes = (768, 6144, 30720)[level]
    return (Structure(7, 0x0020 + 3 * socket + level).text("CPU %d L%d Cache" % (socket + 1, level + 1))
            .numbers("HHHHHBBBB", 0x0180 | level, kilobytes, kilobytes, 0x20, 0x20, 0, 5, 5, 7)
            .numbers("II", kilobytes, kilobytes))


def port(index, internal, name, connector, use):
    return (Structure(8, 0x0030 + index).text(internal).numbers("B", 0).text(name).numbers("BB", connector, use))


def slot(index, lanes, used):
    width = {4: 10, 8: 11, 16: 13}[lanes]
    return (Structure(9, 0x0040 + index).text("PCIe Slot %d (x%d)" % (index + 1, lanes))
            .numbers("BBBBHBBHBB", 0xB1, width, 4 if used else 3, 4, index + 1, 0x0C, 0x01, 0, 0x10 + index, 0))


def memory_array():
    return Structure(16, 0x0060).numbers("BBBIHHQ", 3, 3, 5, 0x80000000, 0xFFFE, 8, 1 << 40)


def module(index):
    socket, channel = divmod(index, 4)
    return (Structure(17, 0x0061 + index).numbers("HHHHHBB", 0x0060, 0xFFFE, 72, 64, 16384, 9, 0)
            .text("CPU %d DIMM %d" % (socket + 1, channel + 1), "Channel %s" % "ABCD"[channel])
            .numbers("BHH", 26, 0x2080, 3200)
            .text(MAKER, "EX%07d" % (4100073 + 977 * index), "AT-%d-%d" % (socket + 1, channel + 1), "EW16R32-D4")
            .numbers("BIHHHH", 2, 0, 2933, 1200, 1200, 1200)
            .numbers("BH", 3, 0x0008).text("1.00").numbers("HHHH", 0, 0, 0, 0)
            .numbers("QQQQII", 0, 16 << 30, 0, 0, 0, 0))


def mapped_address():
    return (Structure(19, 0x0070).numbers("IIHB", 0xFFFFFFFF, 0xFFFFFFFF, 0x0060, 8)
            .numbers("QQ", 0, (128 << 30) - 1))


def management_controller():
    return Structure(38, 0x0080).numbers("BBBBQBB", 1, 0x20, 0x20, 0xFF, 0xCA3, 0, 0)


def onboard(index, kind, name, bus):
    return Structure(41, 0x0090 + index).text(name).numbers("BBHBB", 0x80 | kind, index + 1, 0, bus, 0)


def vendor_record(index):
    """A maker's own type, as servers carry many: it is passed over by who does not know it."""
    return Structure(200 + index % 4, 0x0100 + index).raw(bytes((17 * index + 29 * n) % 251 for n in range(96))) \
        .text("Record %02d of %s" % (index, MAKER))


def structures():
    yield bios()
    yield system()
    yield board()
    yield chassis()
    for socket in range(2):
        yield processor(socket)
    for socket in range(2):
        for level in range(3):
            yield cache(socket, level)
    ports = [("J1", "USB 1", 0x12, 0x10), ("J2", "USB 2", 0x12, 0x10), ("J3", "USB 3", 0x12, 0x10), ("J4", "Video", 0x07, 0x1C),
             ("J5", "Serial", 0x08, 0x09), ("J6", "Ethernet 1", 0x0B, 0x1F), ("J7", "Ethernet 2", 0x0B, 0x1F),
             ("J8", "Management", 0x0B, 0x1F)]
    for index, (internal, name, connector, use) in enumerate(ports):
        yield port(index, internal, name, connector, use)
    for index, lanes in enumerate((16, 8, 8, 16, 8, 4)):
        yield slot(index, lanes, index < 2)
    yield Structure(11, 0x0050).oem_strings(["Invented sample; no such server exists", "Build 118B", "Rack kit 2"])
    yield Structure(13, 0x0051).numbers("BB", 1, 0).raw(bytes(15)).text("en|US|iso8859-1")
    yield memory_array()
    for index in range(8):
        yield module(index)
    yield mapped_address()
    yield Structure(32, 0x0078).raw(bytes(7))
    yield management_controller()
    for index, (kind, name) in enumerate([(3, "Onboard Video"), (5, "Onboard Ethernet 1"), (5, "Onboard Ethernet 2"),
                                          (10, "Onboard SAS Controller")]):
        yield onboard(index, kind, name, 2 + index)
    for index in range(33):
        yield vendor_record(index)
    yield Structure(END_OF_TABLE, 0xFEFF)


def entry_point(table_size):
    entry = bytearray(struct.pack("<5sBBBBBBBIQ", b"_SM3_", 0, 24, 3, 3, 0, 1, 0, table_size, TABLE_OFFSET))
    entry[5] = -sum(entry) & 0xFF
    return bytes(entry).ljust(TABLE_OFFSET, b"\0")


def main():
    target = sys.argv[1] if len(sys.argv) > 1 else os.path.join(os.path.dirname(os.path.abspath(__file__)), "smbios.bin")
    table = b"".join(structure.packed() for structure in structures())
    with open(target, "wb") as file:
        file.write(entry_point(len(table)) + table)


if __name__ == "__main__":
    main()
