// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/VpdPages.h"

#include "tests/providers/storage/MachineTree.h"

namespace NQRVZEP20 {
namespace {

using namespace std::string_literals;

std::string Page(unsigned char code, std::string const& content) {
  std::string page("\0\0\0\0", 4);
  page[1] = static_cast<char>(code);
  page[2] = static_cast<char>(content.size() >> 8);
  page[3] = static_cast<char>(content.size() & 255);
  return page + content;
}

std::vector<std::string> Designators(std::string const& page) {
  std::vector<std::string> texts;
  for (TDesignator const& designator : DesignatorsFrom(page)) texts.push_back(designator.fFormat + " " + designator.fText);
  return texts;
}

TEST(VpdPagesTest, SerialNumbersAreCleanedOfOuterBlanks) {
  EXPECT_EQ(TextOf(SerialNumberFrom(Page(0x80, "  AB 12  \0"s))), "AB 12");
  EXPECT_EQ(TextOf(SerialNumberFrom(Page(0x80, "    "))), "<the disk reports no serial number>");
}

TEST(VpdPagesTest, PagesThatAreTruncatedOrOfAnotherCodeHaveNoValue) {
  for (std::string const& page : {""s, "\0"s, "\0\x80\0"s, Page(0x83, "AB"), "\0\x80\0\x05"s}) {
    EXPECT_FALSE(SerialNumberFrom(page));
    EXPECT_FALSE(CharacteristicsFrom(page).fRotationsPerMinute);
    EXPECT_FALSE(AtaIdentityFrom(page).fModel);
  }
  EXPECT_EQ(TextOf(SerialNumberFrom("\0\x80\0\x09"s + "AB")), "AB");  // shorter than its header states
}

TEST(VpdPagesTest, DesignatorsOfTheLogicalUnitAreRead) {
  std::string const naa = "\x01\x03\0\x08\x50\0\xc5\0\x12\x34\x56\x78"s;   // binary, logical unit, NAA
  std::string const port = "\x61\x93\0\x08\x50\0\xc5\0\x12\x34\x56\x79"s;  // of the target port
  std::string const vendor = "\x02\x01\0\x0a"s + "ATA  Disk ";
  std::string const eui = "\x01\x02\0\x08\0\x01\x02\x03\x04\x05\x06\x07"s;
  std::string const uuid = "\x01\x0a\0\x12\x10\0"s + std::string(16, '\xab');
  EXPECT_THAT(Designators(Page(0x83, naa + port + vendor + eui + uuid)),
              ElementsAre("NAA 5000c50012345678", "T10 vendor ID ATA  Disk", "EUI64 0001020304050607",
                          "UUID abababababababababababababababab"));
}

TEST(VpdPagesTest, ADesignatorThatIsCutEndsThePage) {
  EXPECT_THAT(Designators(Page(0x83, "\x01\x03\0\x08\x50\0"s)), ElementsAre("NAA 5000"));
  EXPECT_THAT(Designators(Page(0x83, "\x01\x03\0"s)), IsEmpty());
  EXPECT_THAT(Designators(Page(0x83, "\x01\x03\0\0"s)), IsEmpty());
}

TEST(VpdPagesTest, RotationAndFormFactorAreCodes) {
  struct TRow {
    std::string fContent, fRotation, fFormFactor;
  };
  TRow const rows[] = {
      {"\x1c\x20\0\x02"s, "7200", "2"},
      {"\0\x01\0\x03"s, "0", "3"},
      {"\0\0\0\0"s, "<the disk reports no rotation rate>", "<the disk reports no form factor>"},
      {"\xff\xff\0\x06"s, "<the disk reports no rotation rate>", "<the disk reports no form factor>"},
      {"\x04\0\0\x05"s, "<the disk reports no rotation rate>", "5"},
      {"\x1c"s, "7168", "<the disk reports no form factor>"},
  };
  for (TRow const& row : rows) {
    TCharacteristics const characteristics = CharacteristicsFrom(Page(0xb1, row.fContent));
    EXPECT_EQ(TextOf(characteristics.fRotationsPerMinute), row.fRotation);
    EXPECT_EQ(TextOf(characteristics.fFormFactor), row.fFormFactor);
  }
}

TEST(VpdPagesTest, TextsOfAtaDataHaveSwappedBytes) {
  std::string data(512, '\0');
  data.replace(20, 6, "S1N2 3");     // word 10
  data.replace(46, 4, "1.30");       // word 23
  data.replace(54, 6, "oMed l");     // word 27
  data.replace(336, 1, "\x03");      // word 168
  data.replace(434, 2, "\x20\x1c");  // word 217
  TAtaIdentity const identity = AtaIdentityFrom(Page(0x89, std::string(56, '\0') + data));
  EXPECT_EQ(TextOf(identity.fSerialNumber), "1S2N3");
  EXPECT_EQ(TextOf(identity.fFirmware), ".103");
  EXPECT_EQ(TextOf(identity.fModel), "Model");
  EXPECT_EQ(TextOf(identity.fFormFactor), "3");
  EXPECT_EQ(TextOf(identity.fRotationsPerMinute), "7200");
}

}  // namespace
}  // namespace NQRVZEP20
