// SPDX-License-Identifier: Apache-2.0
#include "providers/host/SmbiosRecords.h"

#include "tests/providers/host/Structures.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

constexpr char const* kTooShort = "NULL not-given: the firmware's structure ends before this field";
constexpr char const* kUnknown = "NULL not-given: the firmware reports it as unknown";
constexpr char const* kNoText = "NULL not-given: not given by the firmware";

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
using testing::HasSubstr;

// ---- System ----

TStructureMaker System() { return TStructureMaker(1, 0x1b); }

TRecord SystemRecordOf(TStructureMaker const& maker) {
  return ComputerSystemRecord(maker.Make(), "SMBIOS type 1", TSystemName{"db1", "uname"});
}

TEST(SystemRecordTest, EveryFieldIsReadAtItsOffset) {
  TRecord const record = SystemRecordOf(System()
                                            .Text(0x04, "Example Works")
                                            .Text(0x05, "Server Q100 -[1234AB7]-")
                                            .Text(0x06, "06")
                                            .Text(0x07, "KQ12345")
                                            .Bytes(0x08, "\x33\x22\x11\x00\x55\x44\x77\x66\x88\x99\xaa\xbb\xcc\xdd\xee\xff"s)
                                            .Text(0x19, "1234AB7")
                                            .Text(0x1a, "Server Q"));
  EXPECT_EQ(record.GetClassName(), "QRVSG_ComputerSystem");
  EXPECT_THAT(KeysOf(record), ElementsAre("CreationClassName", "Name"));
  ExpectProperties(record,
                   {{"CreationClassName", "string QRVSG_ComputerSystem"},
                    {"Name", "string db1"},
                    {"Manufacturer", "string Example Works"},
                    {"ProductName", "string Server Q100 -[1234AB7]-"},
                    {"Version", "string 06"},
                    {"SerialNumber", "string KQ12345"},
                    {"UUID", "string 00112233-4455-6677-8899-AABBCCDDEEFF"},
                    {"SKUNumber", "string 1234AB7"},
                    {"Family", "string Server Q"},
                    {"IdentifyingDescriptions", "string NULL not-given: the SMBIOS tables contain no strings of type 11 or 12"},
                    {"OtherIdentifyingInfo", "string NULL not-given: the SMBIOS tables contain no strings of type 11 or 12"}});
}

TEST(SystemRecordTest, TheNameAndTheTableHaveDifferentSources) {
  TRecord const record = SystemRecordOf(System());
  EXPECT_EQ(record.GetProperties()[0].fSource, "");
  EXPECT_EQ(record.GetProperties()[1].fSource, "uname");
  EXPECT_EQ(record.GetProperties()[2].fSource, "SMBIOS type 1");
}

TEST(SystemRecordTest, FurtherTextsAreBesideTheirKinds) {
  TIdentifyingTexts const texts{"SMBIOS type 11", {{"OEM string", "a"}, {"Configuration option", "b"}}};
  TRecord const record =
      ComputerSystemRecord(System().Make(), "SMBIOS type 1", TSystemName{"db1", "uname"}, std::optional<TSmbiosVersion>(), texts);
  EXPECT_EQ(PropertyOf(record, "IdentifyingDescriptions"), "string { OEM string, Configuration option }");
  EXPECT_EQ(PropertyOf(record, "OtherIdentifyingInfo"), "string { a, b }");
}

TEST(SystemRecordTest, PlaceholdersAndMissingFieldsAreNullWithAReason) {
  TRecord const record = SystemRecordOf(System().Text(0x04, "System manufacturer").Text(0x05, " ").Byte(0x07, 9));
  ExpectProperties(
      record,
      {{"CreationClassName", "string QRVSG_ComputerSystem"},
       {"Name", "string db1"},
       {"Manufacturer", "string NULL placeholder: placeholder text of the firmware: \"System manufacturer\""},
       {"ProductName", "string NULL not-given: the firmware reports only blanks"},
       {"Version", std::string("string ") + kNoText},
       {"SerialNumber", "string NULL unexpected-form: the firmware refers to string 9, which the structure does not contain"},
       {"UUID", "string NULL not-given: not set by the firmware (all zeros)"},
       {"SKUNumber", std::string("string ") + kNoText},
       {"Family", std::string("string ") + kNoText},
       {"IdentifyingDescriptions", "string NULL not-given: the SMBIOS tables contain no strings of type 11 or 12"},
       {"OtherIdentifyingInfo", "string NULL not-given: the SMBIOS tables contain no strings of type 11 or 12"}});
}

TEST(SystemRecordTest, TheVersionDecidesTheByteOrderOfTheUuid) {
  TStructureMaker const maker = System().Bytes(0x08, "\x33\x22\x11\x00\x55\x44\x77\x66\x88\x99\xaa\xbb\xcc\xdd\xee\xff"s);
  auto const uuid = [&](TFinding<std::optional<TSmbiosVersion>> const& version) {
    return PropertyOf(ComputerSystemRecord(maker.Make(), "SMBIOS type 1", TSystemName{"db1", "uname"}, version), "UUID");
  };
  std::string const asItStands = "string 33221100-5544-7766-8899-AABBCCDDEEFF";
  std::string const turned = "string 00112233-4455-6677-8899-AABBCCDDEEFF";
  for (TSmbiosVersion const& version : {TSmbiosVersion(2, 0), TSmbiosVersion(2, 3), TSmbiosVersion(2, 5)})
    EXPECT_EQ(uuid(std::optional(version)), asItStands) << version.second;
  for (TSmbiosVersion const& version : {TSmbiosVersion(2, 6), TSmbiosVersion(2, 8), TSmbiosVersion(3, 0)})
    EXPECT_EQ(uuid(std::optional(version)), turned) << version.second;
  EXPECT_EQ(uuid(std::optional<TSmbiosVersion>()), turned) << "no entry point";
  EXPECT_EQ(uuid(TMissing{kMissingUnreadable, "f cannot be read"}),
            "string NULL unreadable: the byte order is unknown: f cannot be read");
}

TEST(SystemRecordTest, AUuidThatIsNotSetIsNull) {
  EXPECT_EQ(PropertyOf(SystemRecordOf(System().Bytes(0x08, std::string(16, '\xff'))), "UUID"),
            "string NULL not-given: not set by the firmware (all ones)");
  std::string const counted = "\x00\x02\x00\x03\x00\x04\x00\x05\x00\x06\x00\x07\x00\x08\x00\x09"s;
  EXPECT_EQ(PropertyOf(SystemRecordOf(System().Bytes(0x08, counted)), "UUID"),
            "string NULL placeholder: placeholder text of the firmware: \"03000200-0400-0500-0006-000700080009\"");
}

TEST(SystemRecordTest, AnOldStructureHasFewerFields) {
  TRecord const record = SystemRecordOf(TStructureMaker(1, 0x08).Text(0x05, "Server"));
  EXPECT_EQ(PropertyOf(record, "ProductName"), "string Server");
  EXPECT_EQ(PropertyOf(record, "UUID"), std::string("string ") + kTooShort);
  EXPECT_EQ(PropertyOf(record, "Family"), std::string("string ") + kTooShort);
}

// ---- BIOS ----

TStructureMaker Bios() { return TStructureMaker(0, 0x1a); }

TEST(BiosRecordTest, EveryFieldIsReadAtItsOffset) {
  TRecord const record = BiosRecord(
      Bios().Text(0x04, "Example Works").Text(0x05, "-[QAE118B-1.30]-").Word(0x06, 0xf000).Text(0x08, "03/14/2024").Make(),
      "SMBIOS type 0", 0);
  EXPECT_EQ(record.GetClassName(), "CIM_BIOSElement");
  EXPECT_THAT(KeysOf(record),
              ElementsAre("Name", "Version", "SoftwareElementState", "SoftwareElementID", "TargetOperatingSystem"));
  ExpectProperties(record, {{"Name", "string BIOS 0"},
                            {"Version", "string -[QAE118B-1.30]-"},
                            {"SoftwareElementState", "uint16 3"},
                            {"SoftwareElementID", "string BIOS 0"},
                            {"TargetOperatingSystem", "uint16 0"},
                            {"Manufacturer", "string Example Works"},
                            {"ReleaseDate", "datetime 20240314000000.000000+000"},
                            {"LoadedStartingAddress", "uint64 983040"},
                            {"LoadedEndingAddress", "uint64 1048575"}});
}

TEST(BiosRecordTest, UefiHasNoLoadAddresses) {
  TRecord const record = BiosRecord(Bios().Make(), "", 0);
  EXPECT_EQ(PropertyOf(record, "LoadedStartingAddress"), std::string("uint64 ") + kUnknown);
  EXPECT_EQ(PropertyOf(record, "LoadedEndingAddress"), std::string("uint64 ") + kUnknown);
}

TEST(BiosRecordTest, DatesAreReadInBothForms) {
  struct TRow {
    char const *fText, *fValue;
  } const rows[] = {
      {"01/01/1999", "19990101000000.000000+000"}, {"12/31/2031", "20311231000000.000000+000"},
      {"02/29/2024", "20240229000000.000000+000"}, {"02/29/2000", "20000229000000.000000+000"},
      {"04/30/98", "19980430000000.000000+000"},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(PropertyOf(BiosRecord(Bios().Text(0x08, row.fText).Make(), "", 0), "ReleaseDate"),
              std::string("datetime ") + row.fValue)
        << row.fText;
}

TEST(BiosRecordTest, AnInvalidDateHasAReason) {
  for (std::string const text :
       {"2024-03-14", "3/14/2024", "13/01/2024", "00/10/2024", "02/30/2024", "02/29/2023", "02/29/1900", "04/31/2024",
        "01/00/2024", "01/32/2024", "03/14/20245", "March 2024", "aa/bb/cccc", "03/14/2024 "})
    EXPECT_EQ(PropertyOf(BiosRecord(Bios().Text(0x08, text).Make(), "", 0), "ReleaseDate"),
              "datetime NULL unexpected-form: not in the expected form: \"" + text + "\" is not a date");
  EXPECT_EQ(PropertyOf(BiosRecord(Bios().Make(), "", 0), "ReleaseDate"), std::string("datetime ") + kNoText);
}

// ---- Chassis ----

TStructureMaker Chassis() { return TStructureMaker(3, 0x16); }

TEST(ChassisRecordTest, EveryFieldIsReadAtItsOffset) {
  TRecord const record = ChassisRecord(Chassis()
                                           .Text(0x04, "Example Works")
                                           .Byte(0x05, 23)
                                           .Text(0x06, "Rack 2U")
                                           .Text(0x07, "KQ12345")
                                           .Text(0x08, "RACK-07")
                                           .Byte(0x11, 2)
                                           .Byte(0x12, 2)
                                           .Text(0x15, "1234AB7")
                                           .Make(),
                                       "SMBIOS type 3", 4);
  EXPECT_EQ(record.GetClassName(), "CIM_Chassis");
  EXPECT_THAT(KeysOf(record), ElementsAre("Tag", "CreationClassName"));
  ExpectProperties(record, {{"Tag", "string Chassis 4"},
                            {"CreationClassName", "string CIM_Chassis"},
                            {"Manufacturer", "string Example Works"},
                            {"Version", "string Rack 2U"},
                            {"SerialNumber", "string KQ12345"},
                            {"UserTracking", "string RACK-07"},
                            {"SKU", "string 1234AB7"},
                            {"ChassisPackageType", "uint16 23"},
                            {"ChassisTypeDescription", "string Rack Mount Chassis"},
                            {"LockPresent", "boolean false"},
                            {"Height", "real32 3.5"},
                            {"NumberOfPowerCords", "uint16 2"}});
}

TEST(ChassisRecordTest, TypesHaveTheNumbersAndNamesOfCim) {
  struct TRow {
    int fType;
    char const *fNumber, *fName, *fLock;
  } const rows[] = {
      {1, "uint16 1", "string Other", "boolean false"},
      {3, "uint16 3", "string Desktop", "boolean false"},
      {0x80 | 3, "uint16 3", "string Desktop", "boolean true"},
      {17, "uint16 17", "string Main Server Chassis", "boolean false"},
      {25, "uint16 25", "string Multi-system Chassis", "boolean false"},
      {28, "uint16 1", "string Blade", "boolean false"},
      {29, "uint16 28", "string Blade Enclosure", "boolean false"},
      {30, "uint16 30", "string Tablet", "boolean false"},
      {36, "uint16 36", "string Stick PC", "boolean false"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fType);
    TRecord const record = ChassisRecord(Chassis().Byte(0x05, row.fType).Make(), "", 0);
    EXPECT_EQ(PropertyOf(record, "ChassisPackageType"), row.fNumber);
    EXPECT_EQ(PropertyOf(record, "ChassisTypeDescription"), row.fName);
    EXPECT_EQ(PropertyOf(record, "LockPresent"), row.fLock);
  }
}

TEST(ChassisRecordTest, AnUnknownTypeIsNullAndATypeOutOfRangeIsUnexpected) {
  EXPECT_EQ(PropertyOf(ChassisRecord(Chassis().Byte(0x05, 2).Make(), "", 0), "ChassisPackageType"),
            std::string("uint16 ") + kUnknown);
  for (int type : {0, 37, 127, 0x80 | 37})
    EXPECT_EQ(PropertyOf(ChassisRecord(Chassis().Byte(0x05, type).Make(), "", 0), "ChassisTypeDescription"),
              "string NULL unexpected-form: not in the expected form: chassis type " + std::to_string(type & 0x7f));
}

TEST(ChassisRecordTest, UnspecifiedHeightAndCordsAreNull) {
  TRecord const record = ChassisRecord(Chassis().Make(), "", 0);
  EXPECT_EQ(PropertyOf(record, "Height"), std::string("real32 ") + kUnknown);
  EXPECT_EQ(PropertyOf(record, "NumberOfPowerCords"), std::string("uint16 ") + kUnknown);
}

TEST(ChassisRecordTest, TheSkuFollowsTheContainedElements) {
  EXPECT_EQ(
      PropertyOf(ChassisRecord(TStructureMaker(3, 0x1c).Byte(0x13, 2).Byte(0x14, 3).Text(0x1b, "SKU-9").Make(), "", 0), "SKU"),
      "string SKU-9");
  // 255 elements of 255 bytes end far after the end of the structure.
  EXPECT_EQ(PropertyOf(ChassisRecord(Chassis().Byte(0x13, 255).Byte(0x14, 255).Make(), "", 0), "SKU"),
            std::string("string ") + kTooShort);
  EXPECT_EQ(PropertyOf(ChassisRecord(TStructureMaker(3, 0x0d).Make(), "", 0), "SKU"), std::string("string ") + kTooShort);
}

// ---- Memory ----

TStructureMaker Module() { return TStructureMaker(17, 0x5c); }

std::string ModuleProperty(TStructureMaker const& maker, char const* property) {
  return PropertyOf(MemoryRecord(maker.Make(), "SMBIOS type 17", 0), property);
}

TEST(MemoryRecordTest, EveryFieldIsReadAtItsOffset) {
  TRecord const record = MemoryRecord(Module()
                                          .Word(0x08, 72)
                                          .Word(0x0a, 64)
                                          .Word(0x0c, 16384)
                                          .Byte(0x0e, 9)
                                          .Text(0x10, "CPU 1 DIMM 1")
                                          .Text(0x11, "Channel A")
                                          .Byte(0x12, 0x1a)
                                          .Word(0x15, 3200)
                                          .Text(0x17, "Example Works")
                                          .Text(0x18, "EX4100073")
                                          .Text(0x19, "AT-1-1")
                                          .Text(0x1a, "EW16R32-D4")
                                          .Word(0x20, 2933)
                                          .Make(),
                                      "SMBIOS type 17", 3);
  EXPECT_EQ(record.GetClassName(), "CIM_PhysicalMemory");
  EXPECT_THAT(KeysOf(record), ElementsAre("Tag", "CreationClassName"));
  ExpectProperties(record, {{"Tag", "string Memory device 3"},
                            {"CreationClassName", "string CIM_PhysicalMemory"},
                            {"ElementName", "string CPU 1 DIMM 1"},
                            {"BankLabel", "string Channel A"},
                            {"Manufacturer", "string Example Works"},
                            {"SerialNumber", "string EX4100073"},
                            {"UserTracking", "string AT-1-1"},
                            {"PartNumber", "string EW16R32-D4"},
                            {"Capacity", "uint64 17179869184"},
                            {"FormFactor", "uint16 8"},
                            {"MemoryType", "uint16 26"},
                            {"Description", "string DDR4"},
                            {"TotalWidth", "uint16 72"},
                            {"DataWidth", "uint16 64"},
                            {"IsSpeedInMhz", "boolean true"},
                            {"MaxMemorySpeed", "uint32 3200"},
                            {"ConfiguredMemoryClockSpeed", "uint32 2933"}});
}

TEST(MemoryRecordTest, CapacityIsConvertedToBytes) {
  struct TRow {
    char const* fDescription;
    TStructureMaker fMaker;
    std::string fValue;
  } const rows[] = {
      {"megabytes", Module().Word(0x0c, 512), "536870912"},
      {"kilobytes", Module().Word(0x0c, 0x8000 | 512), "524288"},
      {"the largest of the size field", Module().Word(0x0c, 0x7ffe), "34357641216"},
      {"extended", Module().Word(0x0c, 0x7fff).DWord(0x1c, 65536), "68719476736"},
      {"extended, its highest bit reserved", Module().Word(0x0c, 0x7fff).DWord(0x1c, 0xffffffff), "2251799812636672"},
      {"unknown", Module().Word(0x0c, 0xffff), kUnknown},
      {"extended, but the structure is short", TStructureMaker(17, 0x1c).Word(0x0c, 0x7fff), kTooShort},
      {"no field at all", TStructureMaker(17, 0x0c), kTooShort},
  };
  for (TRow const& row : rows) EXPECT_EQ(ModuleProperty(row.fMaker, "Capacity"), "uint64 " + row.fValue) << row.fDescription;
}

TEST(MemoryRecordTest, GreatSpeedsAreReadFromTheExtendedField) {
  struct TRow {
    char const* fDescription;
    TStructureMaker fMaker;
    std::string fSpeed, fConfigured;
  } const rows[] = {
      {"as they are", Module().Word(0x15, 3200).Word(0x20, 2933), "3200", "2933"},
      {"unknown", Module(), kUnknown, kUnknown},
      {"extended", Module().Word(0x15, 0xffff).DWord(0x54, 70000).Word(0x20, 0xffff).DWord(0x58, 0x80000000 | 68000), "70000",
       "68000"},
      {"extended to unknown", Module().Word(0x15, 0xffff).Word(0x20, 0xffff), kUnknown, kUnknown},
      {"extended, but the structure is short", TStructureMaker(17, 0x22).Word(0x15, 0xffff).Word(0x20, 0xffff), kTooShort,
       kTooShort},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fDescription);
    EXPECT_EQ(ModuleProperty(row.fMaker, "MaxMemorySpeed"), "uint32 " + row.fSpeed);
    EXPECT_EQ(ModuleProperty(row.fMaker, "ConfiguredMemoryClockSpeed"), "uint32 " + row.fConfigured);
    bool const isKnown = row.fSpeed.find("NULL") == std::string::npos;
    EXPECT_EQ(ModuleProperty(row.fMaker, "IsSpeedInMhz"), isKnown ? "boolean true" : "boolean false");
  }
}

TEST(MemoryRecordTest, KindsHaveTheNumbersOfCim) {
  struct TRow {
    int fSmbios;
    std::string fCim;
  };
  TRow const types[] = {{0x01, "1"},  {0x03, "2"},  {0x0f, "17"}, {0x12, "20"}, {0x13, "21"},     {0x14, "23"},    {0x18, "24"},
                        {0x1a, "26"}, {0x1e, "30"}, {0x22, "1"},  {0xff, "1"},  {0x02, kUnknown}, {0x00, kUnknown}};
  for (TRow const& row : types)
    EXPECT_EQ(ModuleProperty(Module().Byte(0x12, row.fSmbios), "MemoryType"), "uint16 " + row.fCim) << row.fSmbios;
  TRow const formFactors[] = {{0x01, "1"}, {0x03, "7"},  {0x04, "2"},  {0x06, "3"},  {0x07, "4"}, {0x08, "6"}, {0x09, "8"},
                              {0x0a, "9"}, {0x0c, "11"}, {0x0d, "12"}, {0x0e, "13"}, {0x0f, "8"}, {0x20, "1"}, {0x02, kUnknown}};
  for (TRow const& row : formFactors)
    EXPECT_EQ(ModuleProperty(Module().Byte(0x0e, row.fSmbios), "FormFactor"), "uint16 " + row.fCim) << row.fSmbios;
}

TEST(MemoryRecordTest, TheDescriptionNamesTypesThatCimDoesNotNumber) {
  EXPECT_EQ(ModuleProperty(Module().Byte(0x12, 0x18), "Description"), "string DDR3");
  EXPECT_EQ(ModuleProperty(Module().Byte(0x12, 0x20), "Description"), "string HBM");
  EXPECT_EQ(ModuleProperty(Module().Byte(0x12, 0x22), "Description"), "string DDR5");
  EXPECT_EQ(ModuleProperty(Module().Byte(0x12, 0x24), "Description"), "string HBM3");
  EXPECT_EQ(ModuleProperty(Module().Byte(0x12, 0x02), "Description"), std::string("string ") + kUnknown);
  EXPECT_THAT(ModuleProperty(Module().Byte(0x12, 0xf0), "Description"), HasSubstr("memory type 240"));
}

TEST(MemoryRecordTest, UnknownWidthsAreNull) {
  EXPECT_EQ(ModuleProperty(Module().Word(0x08, 0xffff), "TotalWidth"), std::string("uint16 ") + kUnknown);
  EXPECT_EQ(ModuleProperty(Module().Word(0x0a, 0xffff), "DataWidth"), std::string("uint16 ") + kUnknown);
}

TEST(MemoryRecordTest, EmptySlotsAreRecognised) {
  EXPECT_TRUE(IsSlotFilled(Module().Word(0x0c, 512).Make()));
  EXPECT_TRUE(IsSlotFilled(Module().Word(0x0c, 0xffff).Make())) << "of unknown size";
  EXPECT_FALSE(IsSlotFilled(Module().Make()));
}

// ---- All ----

// Any record can declare its class, so names, types, keys and order must not depend on the bytes.
TEST(SmbiosRecordsTest, EveryRecordOfAClassHasTheSameShape) {
  TSmbiosStructure const absent(TMissing{kMissingNoTables, "none"});
  TSystemName const name{"db1", "uname"};
  std::pair<TRecord, TRecord> const pairs[] = {
      {SystemRecordOf(System().Text(0x05, "Server")), ComputerSystemRecord(absent, "x", name)},
      {BiosRecord(Bios().Text(0x08, "01/02/2003").Make(), "x", 0), BiosRecord(absent, "x", 1)},
      {ChassisRecord(Chassis().Byte(0x05, 23).Make(), "x", 0), ChassisRecord(absent, "x", 1)},
      {MemoryRecord(Module().Word(0x0c, 1).Make(), "x", 0), MemoryRecord(absent, "x", 1)},
  };
  for (auto const& [full, empty] : pairs) {
    SCOPED_TRACE(full.GetClassName());
    ASSERT_EQ(full.GetProperties().size(), empty.GetProperties().size());
    for (std::size_t at = 0; at < full.GetProperties().size(); ++at) {
      TRecordProperty const &one = full.GetProperties()[at], &other = empty.GetProperties()[at];
      EXPECT_EQ(one.fName, other.fName);
      EXPECT_EQ(one.fValue.GetType(), other.fValue.GetType()) << one.fName;
      EXPECT_EQ(one.fIsKey, other.fIsKey) << one.fName;
      EXPECT_TRUE(other.fIsKey || other.fName == "IsSpeedInMhz" || other.fMissing.fReason == "none") << one.fName;
    }
  }
}

// Every structure of the real tables, cut at every length, with every byte of the formatted area set to 0x00 and to 0xFF.
TEST(SmbiosRecordsTest, NothingIsReadOutsideAStructure) {
  TSystemName const name{"db1", "uname"};
  auto const readAll = [&](std::string const& bytes) {
    TSmbiosStructure const structure(std::vector<unsigned char>(bytes.begin(), bytes.end()));
    std::size_t count = ComputerSystemRecord(structure, "", name).GetProperties().size();
    count += BiosRecord(structure, "", 0).GetProperties().size() + ChassisRecord(structure, "", 0).GetProperties().size();
    count += MemoryRecord(structure, "", 0).GetProperties().size();
    static_cast<void>(IsSlotFilled(structure));
    return count;
  };
  std::string const seeds[] = {System().Text(0x05, "Server").Table(), Chassis().Byte(0x13, 1).Table(),
                               Module().Word(0x0c, 0x7fff).Table()};
  for (std::string const& seed : seeds) {
    for (std::size_t length = 0; length <= seed.size(); ++length) EXPECT_EQ(readAll(seed.substr(0, length)), 49u) << length;
    for (std::size_t at = 0; at < seed.size(); ++at)
      for (int byte : {0x00, 0x01, 0x7f, 0x80, 0xff}) {
        std::string changed = seed;
        changed[at] = static_cast<char>(byte);
        EXPECT_EQ(readAll(changed), 49u) << at;
      }
  }
}

}  // namespace
}  // namespace NQRVZEP20
