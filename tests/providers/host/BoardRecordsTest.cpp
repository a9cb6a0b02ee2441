// SPDX-License-Identifier: Apache-2.0
#include "providers/host/BoardRecords.h"

#include "tests/providers/host/Structures.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

constexpr char const* kUnknown = "NULL not-given: the firmware reports it as unknown";

struct TExpected {
  char const *fProperty, *fValue;
};

void ExpectProperties(TRecord const& record, std::vector<TExpected> const& expected) {
  for (auto const& [property, value] : expected) EXPECT_EQ(PropertyOf(record, property), value) << property;
}

TEST(BoardRecordsTest, EveryFieldOfABoardIsReadAtItsOffset) {
  TStructureMaker maker(2, 0x13);
  maker.Text(0x04, "Example Works").Text(0x05, "Board Q1").Text(0x06, "2.0").Text(0x07, "B123").Text(0x08, "(none)");
  TSmbiosStructure const board =
      maker.Byte(0x09, 0x09).Byte(0x0d, 0x0a).Byte(0x0e, 2).Word(0x0f, 0x1000).Word(0x11, 0x1100).Make();
  ExpectProperties(BoardRecord(board, "SMBIOS type 2", 0),
                   {{"Tag", "string Board 0"},
                    {"Manufacturer", "string Example Works"},
                    {"Model", "string Board Q1"},
                    {"Version", "string 2.0"},
                    {"SerialNumber", "string B123"},
                    {"UserTracking", "string NULL placeholder: placeholder text of the firmware: \"(none)\""},
                    {"HostingBoard", "boolean true"},
                    {"RequiresDaughterBoard", "boolean false"},
                    {"RemovalConditions", "uint16 3"},
                    {"Description", "string Motherboard"}});
  EXPECT_THAT(HandlesOn(board), testing::ElementsAre(0x1000, 0x1100));
}

TEST(BoardRecordsTest, EveryFieldOfASlotIsReadAtItsOffset) {
  TStructureMaker const maker = TStructureMaker(9, 0x11).Text(0x04, "Slot 3").Word(0x09, 3).Byte(0x0c, 0x02);
  TStructureMaker express = maker;
  express.Byte(0x05, 0xb6).Byte(0x06, 13).Byte(0x07, 4).Word(0x0d, 1).Byte(0x0f, 0x3b).Byte(0x10, 0x0a);
  ExpectProperties(SlotRecord(express.Make(), "SMBIOS type 9", 2),
                   {{"Tag", "string Slot 2"},
                    {"ElementName", "string Slot 3"},
                    {"Number", "uint16 3"},
                    {"ConnectorDescription", "string PCI Express 3 x16"},
                    {"MaxDataWidth", "uint16 NULL not-applicable: the slot has lanes"},
                    {"MaxLinkWidth", "uint16 7"},
                    {"Description", "string In use"},
                    {"SupportsHotPlug", "boolean true"},
                    {"OtherIdentifyingInfo", "string 0001:3b:01.2"}});
  TStructureMaker pci = maker;
  pci.Byte(0x05, 6).Byte(0x06, 5).Byte(0x07, 3).Word(0x0d, 0xffff).Byte(0x0f, 0xff).Byte(0x10, 0xff);
  ExpectProperties(SlotRecord(pci.Make(), "SMBIOS type 9", 0),
                   {{"ConnectorDescription", "string PCI"},
                    {"MaxDataWidth", "uint16 32"},
                    {"MaxLinkWidth", "uint16 NULL not-applicable: the slot has no lanes"},
                    {"Description", "string Available"},
                    {"OtherIdentifyingInfo", "string NULL not-applicable: it is not on a PCI bus"}});
}

TEST(BoardRecordsTest, TheTypeOfASlotHasItsWords) {
  struct TRow {
    int fType;
    char const* fWords;
  } const rows[] = {{0x01, "string Other"},
                    {0x03, "string ISA"},
                    {0x13, "string AGP 8X"},
                    {0x20, "string PCI Express 3 SFF-8639 (U.2)"},
                    {0x28, "string OCP NIC before 3.0"},
                    {0xa5, "string PCI Express"},
                    {0xab, "string PCI Express 2"},
                    {0xb8, "string PCI Express 4"},
                    {0xbd, "string PCI Express 4 x16"},
                    {0xc3, "string PCI Express 5 x16"},
                    {0xc6, "string E3.S or E3.L (EDSFF)"},
                    {0x00, "string NULL unexpected-form: not in the expected form: slot type 0"},
                    {0xb7, "string NULL unexpected-form: not in the expected form: slot type 183"},
                    {0xff, "string NULL unexpected-form: not in the expected form: slot type 255"}};
  for (TRow const& row : rows)
    EXPECT_EQ(PropertyOf(SlotRecord(TStructureMaker(9, 0x11).Byte(0x05, row.fType).Make(), "", 0), "ConnectorDescription"),
              row.fWords);
}

TEST(BoardRecordsTest, AMemoryArrayHasItsMaximumAndItsErrorCorrection) {
  TStructureMaker maker(16, 0x17);
  maker.Byte(0x04, 3).Byte(0x05, 3).Byte(0x06, 6).DWord(0x07, 0x00100000).Word(0x0d, 8);
  ExpectProperties(MemoryArrayRecord(maker.Make(), "SMBIOS type 16", 0),
                   {{"Name", "string Memory array 0"},
                    {"MemoryType", "uint16 0"},
                    {"ElementName", "string System memory on the system board, 8 slots"},
                    {"Description", "string Error correction: Multi-bit ECC"},
                    {"MaximumMemoryCapacity", "uint64 1048576"}});
  maker.DWord(0x07, 0x80000000).Bytes(0x0f, LittleEndian(4ull << 40, 8)).Word(0x0d, 1).Byte(0x04, 1).Byte(0x06, 2);
  ExpectProperties(MemoryArrayRecord(maker.Make(), "SMBIOS type 16", 0),
                   {{"ElementName", "string System memory, 1 slot"}, {"MaximumMemoryCapacity", "uint64 4294967296"}});
  EXPECT_EQ(PropertyOf(MemoryArrayRecord(maker.Make(), "", 0), "Description"), std::string("string ") + kUnknown);
}

TEST(BoardRecordsTest, AnOnboardDeviceHasItsPlace) {
  TStructureMaker maker(41, 0x0b);
  maker.Text(0x04, "Embedded NIC 1").Byte(0x05, 0x85).Byte(0x06, 1).Byte(0x09, 4).Byte(0x0a, 0x01);
  ExpectProperties(OnboardDeviceRecord(maker.Make(), "SMBIOS type 41", 0), {{"Tag", "string Onboard device 0"},
                                                                            {"ElementName", "string Embedded NIC 1"},
                                                                            {"DeviceType", "string Ethernet"},
                                                                            {"IsEnabled", "boolean true"},
                                                                            {"TypeInstance", "uint8 1"},
                                                                            {"BusAddress", "string 0000:04:00.1"}});
}

TEST(BoardRecordsTest, AnIpmiInterfaceHasItsAddress) {
  TStructureMaker maker(38, 0x12);
  maker.Byte(0x04, 1).Byte(0x05, 0x20).Byte(0x06, 0x20).Byte(0x07, 0xa0).Bytes(0x08, LittleEndian(0xca3, 8));
  maker.Byte(0x10, 0x49).Byte(0x11, 5);
  TSystemName const name{"db1", "uname"};
  ExpectProperties(IpmiRecord(maker.Make(), "SMBIOS type 38", 0, name), {{"DeviceID", "string IPMI interface 0"},
                                                                         {"InterfaceType", "string KCS"},
                                                                         {"SpecificationVersion", "string 2.0"},
                                                                         {"I2CSlaveAddress", "uint8 32"},
                                                                         {"BaseAddress", "uint64 3234"},
                                                                         {"IsMemoryMapped", "boolean false"},
                                                                         {"RegisterSpacing", "uint8 4"},
                                                                         {"InterruptNumber", "uint8 5"},
                                                                         {"InterruptPolarity", "string Active Low"},
                                                                         {"InterruptTrigger", "string Level"},
                                                                         {"NVStorageAddress", "uint8 160"}});
  ExpectProperties(IpmiRecord(TStructureMaker(38, 0x12).Byte(0x07, 0xff).Byte(0x10, 0x0a).Make(), "SMBIOS type 38", 0, name),
                   {{"InterruptPolarity", "string Active High"},
                    {"InterruptTrigger", "string Edge"},
                    {"NVStorageAddress", "uint8 NULL not-given: the firmware reports it as unknown"}});
  ExpectProperties(IpmiRecord(TStructureMaker(38, 0x12).Make(), "SMBIOS type 38", 0, name),
                   {{"InterruptPolarity", "string NULL not-given: the firmware does not describe the interrupt"}});
  maker.Byte(0x10, 0x10);
  EXPECT_EQ(PropertyOf(IpmiRecord(maker.Make(), "", 0, name), "BaseAddress"), "uint64 3235") << "the lowest bit is set";
}

// Structures cut at every length, and with every byte of the formatted area set to each of some values.
TEST(BoardRecordsTest, NothingIsReadOutsideAStructure) {
  std::string const seed = TStructureMaker(2, 0x20).Text(0x04, "x").Byte(0x0e, 200).Table();
  auto const read = [](std::string const& bytes) {
    TSmbiosStructure const structure(std::vector<unsigned char>(bytes.begin(), bytes.end()));
    HandlesOn(structure);
    return BoardRecord(structure, "", 0).GetProperties().size() + SlotRecord(structure, "", 0).GetProperties().size() +
           MemoryArrayRecord(structure, "", 0).GetProperties().size() +
           OnboardDeviceRecord(structure, "", 0).GetProperties().size() +
           IpmiRecord(structure, "", 0, TSystemName{"db1", "uname"}).GetProperties().size();
  };
  for (std::size_t length = 0; length <= seed.size(); ++length) EXPECT_EQ(read(seed.substr(0, length)), 48u) << length;
  for (std::size_t at = 0; at < seed.size(); ++at)
    for (int byte : {0x00, 0x01, 0x7f, 0x80, 0xff}) {
      std::string changed = seed;
      changed[at] = static_cast<char>(byte);
      EXPECT_EQ(read(changed), 48u) << at;
    }
}

}  // namespace
}  // namespace NQRVZEP20
