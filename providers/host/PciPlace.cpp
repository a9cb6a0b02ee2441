// SPDX-License-Identifier: Apache-2.0
#include "PciPlace.h"

#include "SmbiosFields.h"

#include <cstdio>

namespace NQRVZEP20 {

namespace {

constexpr char const* kOldTypes[] = {"ISA",
                                     "MCA",
                                     "EISA",
                                     "PCI",
                                     "PC Card (PCMCIA)",
                                     "VL-VESA",
                                     "Proprietary",
                                     "Processor card",
                                     "Proprietary memory card",
                                     "I/O riser card",
                                     "NuBus",
                                     "PCI 66 MHz",
                                     "AGP",
                                     "AGP 2X",
                                     "AGP 4X",
                                     "PCI-X",
                                     "AGP 8X",
                                     "M.2 Socket 1-DP",
                                     "M.2 Socket 1-SD",
                                     "M.2 Socket 2",
                                     "M.2 Socket 3",
                                     "MXM Type I",
                                     "MXM Type II",
                                     "MXM Type III",
                                     "MXM Type III-HE",
                                     "MXM Type IV",
                                     "MXM 3.0 Type A",
                                     "MXM 3.0 Type B",
                                     "PCI Express 2 SFF-8639 (U.2)",
                                     "PCI Express 3 SFF-8639 (U.2)",
                                     "PCI Express Mini 52-pin with bottom-side keep-outs",
                                     "PCI Express Mini 52-pin without bottom-side keep-outs",
                                     "PCI Express Mini 76-pin",
                                     "PCI Express 4 SFF-8639 (U.2)",
                                     "PCI Express 5 SFF-8639 (U.2)",
                                     "OCP NIC 3.0 small form factor",
                                     "OCP NIC 3.0 large form factor",
                                     "OCP NIC before 3.0"};  // from 3

// From 0xA5: four generations with six widths each, the first of which is any width; then those after U.2 slots.
constexpr char const* kExpressTypes[] = {"PCI Express",      "PCI Express x1",   "PCI Express x2",   "PCI Express x4",
                                         "PCI Express x8",   "PCI Express x16",  "PCI Express 2",    "PCI Express 2 x1",
                                         "PCI Express 2 x2", "PCI Express 2 x4", "PCI Express 2 x8", "PCI Express 2 x16",
                                         "PCI Express 3",    "PCI Express 3 x1", "PCI Express 3 x2", "PCI Express 3 x4",
                                         "PCI Express 3 x8", "PCI Express 3 x16"};  // from 0xA5
constexpr char const* kNewerExpressTypes[] = {
    "PCI Express 4",          "PCI Express 4 x1",     "PCI Express 4 x2",    "PCI Express 4 x4",
    "PCI Express 4 x8",       "PCI Express 4 x16",    "PCI Express 5",       "PCI Express 5 x1",
    "PCI Express 5 x2",       "PCI Express 5 x4",     "PCI Express 5 x8",    "PCI Express 5 x16",
    "PCI Express 6 or later", "E1.S or E1.L (EDSFF)", "E3.S or E3.L (EDSFF)"};  // from 0xB8

TFinding<std::string> SlotTypeFrom(std::uint8_t type) {
  if (type == 1) return std::string("Other");
  if (type == 2) return Unknown();
  if (type >= 0xb8) return WordFor(type, kNewerExpressTypes, 0xb8, "slot type");
  return type >= 0xa5 ? WordFor(type, kExpressTypes, 0xa5, "slot type") : WordFor(type, kOldTypes, 3, "slot type");
}

TMissing HasLanes() { return {kMissingNotApplicable, "the slot has lanes"}; }
TMissing HasNoLanes() { return {kMissingNotApplicable, "the slot has no lanes"}; }

// 3 to 7 are 8 to 128 bits.
TFinding<std::uint16_t> DataWidthFrom(std::uint8_t width) {
  if (width == 2) return Unknown();
  if (width >= 3 && width <= 7) return static_cast<std::uint16_t>(1u << width);
  if (width >= 8 && width <= 14) return HasLanes();
  return NotOfTheForm("slot width " + std::to_string(width));
}

// 8 to 14 are x1, x2, x4, x8, x12, x16 and x32.
TFinding<std::uint16_t> LinkWidthFrom(std::uint8_t width) {
  if (width == 2) return Unknown();
  if (width >= 8 && width <= 14) return static_cast<std::uint16_t>(width - 6);
  if (width >= 3 && width <= 7) return HasNoLanes();
  return NotOfTheForm("slot width " + std::to_string(width));
}

TFinding<std::string> UsageFrom(std::uint8_t usage) {
  constexpr char const* words[] = {"Available", "In use", "Not available"};
  if (usage == 1) return std::string("Other");
  if (usage == 2) return Unknown();
  return WordFor(usage, words, 3, "slot usage");
}

}  // namespace

TFinding<std::string> SlotTypeOf(TSmbiosStructure const& slot) { return slot.Byte(0x05).Then(SlotTypeFrom); }
TFinding<std::uint16_t> SlotDataWidthOf(TSmbiosStructure const& slot) { return slot.Byte(0x06).Then(DataWidthFrom); }
TFinding<std::uint16_t> SlotLinkWidthOf(TSmbiosStructure const& slot) { return slot.Byte(0x06).Then(LinkWidthFrom); }
TFinding<std::string> SlotUsageOf(TSmbiosStructure const& slot) { return slot.Byte(0x07).Then(UsageFrom); }

TFinding<std::string> PciAddressOf(TSmbiosStructure const& structure, std::size_t offset) {
  return structure.Bytes(offset, 4).Then([](std::vector<unsigned char> const& bytes) -> TFinding<std::string> {
    unsigned const segment = bytes[0] | bytes[1] << 8, bus = bytes[2], device = bytes[3] >> 3, function = bytes[3] & 7;
    if (bus == 0xff && bytes[3] == 0xff) return TMissing{kMissingNotApplicable, "it is not on a PCI bus"};
    char text[16];
    std::snprintf(text, sizeof text, "%04x:%02x:%02x.%x", segment, bus, device, function);
    return std::string(text);
  });
}

}  // namespace NQRVZEP20
