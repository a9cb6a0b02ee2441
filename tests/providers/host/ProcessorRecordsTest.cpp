// SPDX-License-Identifier: Apache-2.0
#include "providers/host/ProcessorRecords.h"

#include "tests/providers/host/Structures.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

constexpr char const* kTooShort = "NULL not-given: the firmware's structure ends before this field";
constexpr char const* kUnknown = "NULL not-given: the firmware reports it as unknown";

struct TExpected {
  char const* fProperty;
  std::string fValue;
};

// Every property of the record, in order.
void ExpectProperties(TRecord const& record, std::vector<TExpected> const& expected) {
  ASSERT_EQ(record.GetProperties().size(), expected.size());
  for (std::size_t at = 0; at < expected.size(); ++at) {
    EXPECT_EQ(record.GetProperties()[at].fName, expected[at].fProperty);
    EXPECT_EQ(PropertyOf(record, expected[at].fProperty), expected[at].fValue) << expected[at].fProperty;
  }
}

std::vector<std::string> KeysOf(TRecord const& record) {
  std::vector<std::string> keys;
  for (TRecordProperty const& property : record.GetProperties())
    if (property.fIsKey) keys.push_back(property.fName);
  return keys;
}

using testing::ElementsAre;

TStructureMaker Processor() { return TStructureMaker(4, 0x30); }

TRecord ProcessorRecordOf(TStructureMaker const& maker) {
  return ProcessorRecord(maker.Make(), "SMBIOS type 4", 1, TSystemName{"db1", "uname"}, TMissing{kMissingNoTables, "none"});
}

TEST(ProcessorRecordTest, EveryFieldIsReadAtItsOffset) {
  TRecord const record = ProcessorRecordOf(Processor()
                                               .Text(0x04, "CPU 1")
                                               .Byte(0x05, 3)
                                               .Byte(0x06, 0xb3)
                                               .Bytes(0x08, "\x54\x06\x05\x00\xff\xfb\xeb\xbf"s)
                                               .Text(0x10, "Example Processor P2400")
                                               .Word(0x12, 100)
                                               .Word(0x14, 3600)
                                               .Word(0x16, 2400)
                                               .Byte(0x18, 0x41)
                                               .Byte(0x19, 0x2b)
                                               .Byte(0x24, 12)
                                               .Word(0x26, 0x00fc));
  EXPECT_EQ(record.GetClassName(), "CIM_Processor");
  EXPECT_THAT(KeysOf(record), ElementsAre("SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID"));
  ExpectProperties(record, {{"SystemCreationClassName", "string QRVSG_ComputerSystem"},
                            {"SystemName", "string db1"},
                            {"CreationClassName", "string CIM_Processor"},
                            {"DeviceID", "string Processor 1"},
                            {"Name", "string CPU 1"},
                            {"ElementName", "string Example Processor P2400"},
                            {"Role", "string Central Processor"},
                            {"Family", "uint16 179"},
                            {"UpgradeMethod", "uint16 43"},
                            {"MaxClockSpeed", "uint32 3600"},
                            {"CurrentClockSpeed", "uint32 2400"},
                            {"ExternalBusClockSpeed", "uint32 100"},
                            {"DataWidth", "uint16 64"},
                            {"UniqueID", "string 54060500FFFBEBBF"},
                            {"CPUStatus", "uint16 1"},
                            {"NumberOfEnabledCores", "uint16 12"},
                            {"Characteristics", "uint16 { 2, 4, 5, 6, 7 }"},
                            {"Stepping", "string NULL no-smbios: none"},
                            {"IdentifyingDescriptions", "string NULL no-smbios: none"},
                            {"OtherIdentifyingInfo", "string NULL no-smbios: none"}});
}

TEST(ProcessorRecordTest, FieldsThatAreUnknownToTheFirmwareAreNull) {
  TRecord const record = ProcessorRecordOf(Processor().Byte(0x05, 2).Byte(0x06, 2).Byte(0x19, 2).Word(0x26, 0x0002));
  for (char const* property : {"Family", "UpgradeMethod", "CPUStatus", "DataWidth", "NumberOfEnabledCores"})
    EXPECT_EQ(PropertyOf(record, property), std::string("uint16 ") + kUnknown) << property;
  for (char const* property : {"MaxClockSpeed", "CurrentClockSpeed", "ExternalBusClockSpeed"})
    EXPECT_EQ(PropertyOf(record, property), std::string("uint32 ") + kUnknown) << property;
  EXPECT_EQ(PropertyOf(record, "Role"), std::string("string ") + kUnknown);
  EXPECT_EQ(PropertyOf(record, "UniqueID"), "string NULL not-given: not set by the firmware (all zeros)");
}

TEST(ProcessorRecordTest, NarrowFieldsMayReferToWideFields) {
  struct TRow {
    char const* fDescription;
    TStructureMaker fMaker;
    char const *fProperty, *fValue;
  } const rows[] = {
      {"family 254 names the second field", Processor().Byte(0x06, 0xfe).Word(0x28, 0x0101), "Family", "uint16 257"},
      {"family below 254 is itself", Processor().Byte(0x06, 0xfd).Word(0x28, 0x0101), "Family", "uint16 253"},
      {"255 cores name the second field", Processor().Byte(0x24, 0xff).Word(0x2c, 384), "NumberOfEnabledCores", "uint16 384"},
      {"254 cores are themselves", Processor().Byte(0x24, 0xfe).Word(0x2c, 384), "NumberOfEnabledCores", "uint16 254"},
      {"255 cores in a structure without it", TStructureMaker(4, 0x28).Byte(0x24, 0xff), "NumberOfEnabledCores", "uint16 255"},
      {"a socket newer than CIM", Processor().Byte(0x19, 57), "UpgradeMethod", "uint16 1"},
      {"the last socket of CIM", Processor().Byte(0x19, 56), "UpgradeMethod", "uint16 56"},
      {"a 32-bit processor", Processor().Word(0x26, 0x0008), "DataWidth", "uint16 32"},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(PropertyOf(ProcessorRecordOf(row.fMaker), row.fProperty), row.fValue) << row.fDescription;
}

TEST(ProcessorRecordTest, FieldsOfNewerVersionsAreMissingInOldStructures) {
  TRecord const record = ProcessorRecordOf(TStructureMaker(4, 0x1a).Byte(0x06, 0xfe));
  EXPECT_EQ(PropertyOf(record, "Family"), std::string("uint16 ") + kTooShort);
  EXPECT_EQ(PropertyOf(record, "DataWidth"), std::string("uint16 ") + kTooShort);
  EXPECT_EQ(PropertyOf(record, "NumberOfEnabledCores"), std::string("uint16 ") + kTooShort);
}

TEST(ProcessorRecordTest, ARoleOutOfRangeIsUnexpected) {
  EXPECT_EQ(PropertyOf(ProcessorRecordOf(Processor().Byte(0x05, 6)), "Role"), "string Video Processor");
  EXPECT_EQ(PropertyOf(ProcessorRecordOf(Processor().Byte(0x05, 7)), "Role"),
            "string NULL unexpected-form: not in the expected form: processor type 7");
  EXPECT_EQ(PropertyOf(ProcessorRecordOf(Processor()), "Role"),
            "string NULL unexpected-form: not in the expected form: processor type 0");
}

TProcessorFacts Facts() {
  TMissing const none{kMissingNotGiven, "the kernel does not know"};
  return {none, none, none, none, none, 8, 16, {{"Vendor", "Example"}, {"Model", "7"}}};
}

TEST(ProcessorRecordTest, TheKernelKnowsNameSpeedAndCoresBetterThanTheFirmware) {
  TStructureMaker const firmware =
      Processor().Text(0x10, "pc-i440fx").Word(0x14, 2000).Word(0x16, 2000).Byte(0x24, 1).Word(0x26, 0x0002);
  TProcessorFacts facts = Facts();
  auto const record = [&] { return ProcessorRecord(firmware.Make(), "SMBIOS type 4", 0, TSystemName{"db1", "uname"}, facts); };
  EXPECT_EQ(PropertyOf(record(), "ElementName"), "string pc-i440fx") << "the kernel has no name";
  EXPECT_EQ(PropertyOf(record(), "MaxClockSpeed"), "uint32 2000");
  EXPECT_EQ(PropertyOf(record(), "CurrentClockSpeed"), "uint32 2000");
  EXPECT_EQ(PropertyOf(record(), "DataWidth"), std::string("uint16 ") + kUnknown) << "neither has it";

  facts.fBrand = std::string("Example P2400");
  facts.fMaxMegahertz = std::uint32_t(3600);
  facts.fCurrentMegahertz = std::uint32_t(2400);
  facts.fDataWidth = std::uint16_t(64);
  EXPECT_EQ(PropertyOf(record(), "ElementName"), "string Example P2400");
  EXPECT_EQ(PropertyOf(record(), "MaxClockSpeed"), "uint32 3600");
  EXPECT_EQ(PropertyOf(record(), "CurrentClockSpeed"), "uint32 2400");
  EXPECT_EQ(PropertyOf(record(), "DataWidth"), "uint16 64");
  EXPECT_EQ(PropertyOf(record(), "NumberOfEnabledCores"), "uint16 8");
  EXPECT_EQ(PropertyOf(record(), "IdentifyingDescriptions"), "string { Vendor, Model }");
  EXPECT_EQ(PropertyOf(record(), "OtherIdentifyingInfo"), "string { Example, 7 }");
}

// Any record can declare its class, so names, types, keys and order must not depend on the bytes or on the kernel.
TEST(ProcessorRecordTest, EveryRecordHasTheSameShape) {
  TSmbiosStructure const absent(TMissing{kMissingNoTables, "none"});
  TRecord const full = ProcessorRecord(Processor().Byte(0x24, 4).Make(), "x", 0, TSystemName{"db1", "uname"}, Facts());
  TRecord const empty = ProcessorRecord(absent, "x", 0, TSystemName{"db1", "uname"}, TMissing{kMissingNoTables, "none"});
  ASSERT_EQ(full.GetProperties().size(), empty.GetProperties().size());
  for (std::size_t at = 0; at < full.GetProperties().size(); ++at) {
    TRecordProperty const &one = full.GetProperties()[at], &other = empty.GetProperties()[at];
    EXPECT_EQ(one.fName, other.fName);
    EXPECT_EQ(one.fValue.GetType(), other.fValue.GetType()) << one.fName;
    EXPECT_TRUE(other.fIsKey || other.fMissing.fReason == "none") << one.fName;
  }
}

// A structure cut at every length, and with every byte of the formatted area set to each of some values.
TEST(ProcessorRecordTest, NothingIsReadOutsideAStructure) {
  std::string const seed = Processor().Byte(0x06, 0xfe).Table();
  auto const read = [](std::string const& bytes) {
    TSmbiosStructure const structure(std::vector<unsigned char>(bytes.begin(), bytes.end()));
    static_cast<void>(IsSocketFilled(structure));
    return ProcessorRecord(structure, "", 0, TSystemName{"db1", "uname"}, TMissing()).GetProperties().size();
  };
  for (std::size_t length = 0; length <= seed.size(); ++length) EXPECT_EQ(read(seed.substr(0, length)), 20u) << length;
  for (std::size_t at = 0; at < seed.size(); ++at)
    for (int byte : {0x00, 0x01, 0x7f, 0x80, 0xff}) {
      std::string changed = seed;
      changed[at] = static_cast<char>(byte);
      EXPECT_EQ(read(changed), 20u) << at;
    }
}

TEST(ProcessorRecordTest, EmptySocketsAreRecognised) {
  EXPECT_TRUE(IsSocketFilled(Processor().Byte(0x18, 0x41).Make()));
  EXPECT_FALSE(IsSocketFilled(Processor().Byte(0x18, 0x00).Make()));
  EXPECT_TRUE(IsSocketFilled(TStructureMaker(4, 0x10).Make())) << "without that field";
}

}  // namespace
}  // namespace NQRVZEP20
