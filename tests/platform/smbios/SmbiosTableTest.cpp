// SPDX-License-Identifier: Apache-2.0

// Tests the parser of libsmbios.so with real, damaged and hostile tables.

#include "platform/smbios/SmbiosTable.h"

#include "tests/SmbiosTables.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <random>
#include <regex>

namespace NQRVZEP20 {
namespace {

using smbios::DmiTableIn;
using smbios::TStructure;
using smbios::TStructureReader;
using testing::ElementsAre;
using testing::IsEmpty;

// Returns the types of the structures of a table. The table is copied into a buffer of exactly its size, so that the address
// sanitizer detects a read past its end. Checks that each structure is complete, within the table, and adjacent to the previous
// one.
std::vector<int> TypesIn(std::string const& bytes) {
  std::unique_ptr<char[]> const exact(new char[bytes.size()]);
  std::memcpy(exact.get(), bytes.data(), bytes.size());
  TStructureReader reader({exact.get(), bytes.size()});
  std::vector<int> types;
  char const* end = exact.get();
  for (TStructure structure = reader.Next(); !structure.empty(); structure = reader.Next()) {
    EXPECT_EQ(structure.data(), end);
    EXPECT_GE(structure.size(), 6u);
    EXPECT_EQ(structure.substr(structure.size() - 2), "\0\0"s);
    end = structure.data() + structure.size();
    types.push_back(smbios::TypeOf(structure));
  }
  EXPECT_LE(end, exact.get() + bytes.size());
  EXPECT_TRUE(reader.Next().empty()) << "a reader at the end stays at the end";
  return types;
}

TEST(SmbiosTableTest, ReadsTheStructuresOfRealTables) {
  for (std::string const& name : kRealTables) {
    SCOPED_TRACE(name);
    EXPECT_THAT(TypesIn(RealTable(name)), ElementsAre(0, 1, 3, 4, 16, 17, 19, 32, 127));
  }
}

TEST(SmbiosTableTest, AStructureEndsAfterItsDoubleZero) {
  std::string const first = Structure(1, "\1\2\0\0"s, {"one", "two"});
  std::string const second = Structure(2, "ab");
  std::string const table = first + second + EndOfTable();
  TStructureReader reader(table);
  EXPECT_EQ(reader.Next(), first);
  EXPECT_EQ(reader.Next(), second);
  EXPECT_EQ(reader.Next(), EndOfTable());
  EXPECT_TRUE(reader.Next().empty());
}

TEST(SmbiosTableTest, TypesAreUnsigned) { EXPECT_THAT(TypesIn(Structure(255, "") + Structure(128, "")), ElementsAre(255, 128)); }

TEST(SmbiosTableTest, NextOfTypeSkipsTheOthersAndContinuesAfterTheLast) {
  std::string const table =
      Structure(17, "a") + Structure(4, "b") + Structure(17, "c") + Structure(17, "d") + EndOfTable() + Structure(17, "e");
  TStructureReader reader(table);
  EXPECT_EQ(reader.NextOfType(17), Structure(17, "a"));
  EXPECT_EQ(reader.NextOfType(17), Structure(17, "c"));
  EXPECT_TRUE(reader.NextOfType(4).empty()) << "the only structure of type 4 precedes the position";
  EXPECT_TRUE(reader.NextOfType(17).empty()) << "the previous search has advanced to the end";
}

TEST(SmbiosTableTest, AReaderWithoutATableIsAtTheEnd) {
  EXPECT_TRUE(TStructureReader().Next().empty());
  EXPECT_TRUE(TStructureReader().NextOfType(0).empty());
}

TEST(SmbiosTableTest, DamagedTablesEndBeforeTheDamage) {
  std::string const good = Structure(0, "xy", {"ok"});
  struct TRow {
    char const* fWhat;
    std::string fTable;
    std::vector<int> fTypes;
  };
  TRow const rows[] = {
      {"empty", "", {}},
      {"one byte", "\0"s, {}},
      {"a header without its last byte", "\1\4\0"s, {}},
      {"only a header", "\1\4\0\0"s, {}},
      {"a header and one zero", "\1\4\0\0\0"s, {}},
      {"the smallest structure", "\1\4\0\0\0\0"s, {1}},
      {"type 127 missing", good + good, {0, 0}},
      {"bytes after type 127", good + EndOfTable() + good, {0, 127}},
      {"bytes after the last complete structure", good + "abc", {0}},
      {"length 0", good + "\1\0\0\0\0\0"s + good, {0}},
      {"length 1", good + "\1\1\0\0\0\0"s + good, {0}},
      {"length 3", good + "\1\3\0\0\0\0"s + good, {0}},
      {"length past the end", good + "\1\x20\0\0\0\0"s, {0}},
      {"length one past the end", "\1\7\0\0\0\0"s, {}},
      {"length up to the end, no string set", "\1\6\0\0\0\0"s, {}},
      {"length 255", "\1\xFF\0\0"s + std::string(200, '\0'), {}},
      {"no double zero", good + "\1\4\0\0"s + "one\0two\0"s, {0}},
      {"no zero byte", good + "\1\4\0\0"s + std::string(100, 'x'), {0}},
      {"the zeros begin in the formatted area", "\1\5\0\0\0"s + "\0"s, {}},
      {"an empty string before others", "\1\4\0\0\0one\0\0"s, {1}},
      {"all zero", std::string(4096, '\0'), {}},
      {"all 0xFF", std::string(4096, '\xFF'), {}},
      {"type 127 first", EndOfTable() + good, {127}},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(TypesIn(row.fTable), row.fTypes);
  }
}

TEST(SmbiosTableTest, ATruncatedTableHasOnlyItsCompleteStructures) {
  std::string const table = RealTable("full");
  std::vector<int> const all = TypesIn(table);
  for (std::size_t size = 0; size < table.size(); ++size) {
    SCOPED_TRACE(size);
    std::vector<int> const types = TypesIn(table.substr(0, size));
    ASSERT_LT(types.size(), all.size());
    EXPECT_TRUE(std::equal(types.begin(), types.end(), all.begin()));
  }
}

TEST(SmbiosTableTest, NoChangedByteMakesTheReaderLeaveTheTable) {
  std::string table = RealTable("full");
  std::size_t changed = 0;
  for (char& byte : table) {
    char const old = byte;
    for (int value : {0, 1, 3, 4, 5, 0x7F, 0x80, 0xFE, 0xFF}) {
      byte = static_cast<char>(value);
      changed += TypesIn(table).size() != 9;
    }
    byte = old;
  }
  EXPECT_GT(changed, 0u);
}

TEST(SmbiosTableTest, NoiseIsNotReadBeyondItsEnd) {
  for (unsigned seed = 0; seed < 200; ++seed) {
    SCOPED_TRACE(seed);
    std::mt19937 random(seed);
    std::string noise(65536, '\0');
    // Many zeros and small lengths make parts of the noise look like structures.
    for (char& byte : noise) byte = static_cast<char>(random() % 3 == 0 ? random() % 8 : random());
    noise[0] = 1;  // the header of a structure
    noise[1] = 4;
    EXPECT_THAT(TypesIn(noise), testing::Not(IsEmpty()));
  }
}

TEST(SmbiosTableTest, AMillionStructuresAreReadOneByOne) {
  std::string table;
  for (int n = 0; n < 1000000; ++n) table.append("\1\4\0\0\0\0", 6);
  TStructureReader reader(table);
  int structures = 0;
  while (!reader.Next().empty()) ++structures;
  EXPECT_EQ(structures, 1000000);
}

TEST(SmbiosTableTest, ABareTableIsTheWholeFile) {
  for (std::string const& name : kRealTables) EXPECT_EQ(DmiTableIn(RealTable(name)), RealTable(name)) << name;
  EXPECT_EQ(DmiTableIn("_SM"), "_SM");
  EXPECT_EQ(DmiTableIn("_DMI_"), "_DMI_");
  std::string const noEntryPoint = "_DMI_" + std::string(100, 'x');
  EXPECT_EQ(DmiTableIn(noEntryPoint), noEntryPoint) << "\"_\" is the type of the first structure, 95";
  EXPECT_TRUE(DmiTableIn("").empty());
}

TEST(SmbiosTableTest, AnEntryPointRefersToTheTable) {
  std::string const table = RealTable("full");
  struct TRow {
    char const* fWhat;
    std::string fFile;
    std::string fTable;
  };
  TRow const rows[] = {
      {"32 bits", EntryPoint32(table.size()) + table, table},
      {"32 bits, the length 0x1E, a known mistake", EntryPoint32(table.size(), 32, 0x1E) + table, table},
      {"32 bits, bytes after the table", EntryPoint32(table.size()) + table + "after", table},
      {"32 bits, a gap before the table", EntryPoint32(table.size(), 48) + std::string(16, 'x') + table, table},
      {"32 bits, the file ends within the table", EntryPoint32(table.size()) + table.substr(0, 100), table.substr(0, 100)},
      {"32 bits, a table of one byte", EntryPoint32(1) + table, table.substr(0, 1)},
      {"before 2.1", EntryPointLegacy(table.size()) + table, table},
      {"before 2.1, the table immediately after it", EntryPointLegacy(table.size(), 15).substr(0, 15) + table, table},
      {"before 2.1, the file ends within the table", EntryPointLegacy(table.size()) + table.substr(0, 100), table.substr(0, 100)},
      {"64 bits", EntryPoint64(table.size()) + table, table},
      {"64 bits, the table immediately after it", EntryPoint64(table.size(), 24).substr(0, 24) + table, table},
      {"64 bits, the largest possible size", EntryPoint64(0xFFFFFFFF) + table, table},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(DmiTableIn(row.fFile), row.fTable);
  }
}

TEST(SmbiosTableTest, AnInvalidEntryPointHasNoTable) {
  std::string const table = RealTable("full");
  std::string const sound32 = EntryPoint32(table.size()) + table;
  std::string const sound64 = EntryPoint64(table.size()) + table;
  auto const with = [](std::string file, std::size_t offset, char byte) {
    file[offset] = byte;
    return file;
  };
  struct TRow {
    char const* fWhat;
    std::string fFile;
  };
  std::string const wrongInnerAnchor = WithCheckSum(WithCheckSum(with(sound32, 0x10, '-'), 0x15, 0x10, 0x0F), 4, 0, 0x1F);
  std::string const wrongInnerChecksum = WithCheckSum(with(sound32, 0x1E, 9), 4, 0, 0x1F);
  TRow const rows[] = {
      {"32 bits: only the anchor", "_SM_"},
      {"32 bits: truncated", sound32.substr(0, 31)},
      {"32 bits: no table after it", EntryPoint32(table.size())},
      {"32 bits: wrong checksum", with(sound32, 8, 1)},
      {"32 bits: wrong inner anchor", wrongInnerAnchor},
      {"32 bits: wrong inner checksum", wrongInnerChecksum},
      {"32 bits: length too small", EntryPoint32(table.size(), 32, 0x1D) + table},
      {"32 bits: length too large", WithCheckSum(with(sound32, 5, 0x21), 4, 0, 0x21)},
      {"32 bits: table inside the entry point", EntryPoint32(table.size(), 0x1E) + table},
      {"32 bits: table after the end of the file", EntryPoint32(table.size(), 32 + table.size() + 1) + table},
      {"32 bits: highest address", EntryPoint32(table.size(), 0xFFFFFFFF) + table},
      {"32 bits: size 0", EntryPoint32(0) + table},
      {"before 2.1: no table after it", EntryPointLegacy(table.size())},
      {"before 2.1: table inside the entry point", EntryPointLegacy(table.size(), 14) + table},
      {"before 2.1: highest address", EntryPointLegacy(table.size(), 0xFFFFFFFF) + table},
      {"before 2.1: size 0", EntryPointLegacy(0) + table},
      {"64 bits: only the anchor", "_SM3_"},
      {"64 bits: truncated", sound64.substr(0, 23)},
      {"64 bits: wrong checksum", with(sound64, 8, 9)},
      {"64 bits: length too small", EntryPoint64(table.size(), 32, 0x17) + table},
      {"64 bits: length too large", WithCheckSum(with(sound64, 6, 0x21), 5, 0, 0x21)},
      {"64 bits: table inside the entry point", EntryPoint64(table.size(), 23) + table},
      {"64 bits: highest address", EntryPoint64(table.size(), ~0ULL) + table},
      {"64 bits: size 0", EntryPoint64(0) + table},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_TRUE(DmiTableIn(row.fFile).empty());
  }
}

TEST(SmbiosTableTest, RealEntryPointsAreValidExceptForTheirAddress) {
  for (std::string const& name : kRealTables) {
    SCOPED_TRACE(name);
    std::string entry = ReadFile(TestDataPath("smbios/" + name + "/smbios_entry_point"));
    std::string const table = RealTable(name);
    bool const is64 = entry.size() == 24;
    entry.resize(32);
    EXPECT_TRUE(DmiTableIn(entry + table).empty()) << "a physical address is after the end of the file";

    // The address becomes 32 and the checksums are adjusted, as `dmidecode --dump-bin` does.
    if (is64) {
      entry = WithCheckSum(entry.replace(0x10, 8, LittleEndian(32, 8)), 5, 0, 24);
    } else {
      entry = WithCheckSum(entry.replace(0x18, 4, LittleEndian(32, 4)), 0x15, 0x10, 0x0F);
      entry = WithCheckSum(entry, 4, 0, 0x1F);
    }
    EXPECT_EQ(DmiTableIn(entry + table), table);
  }
}

TEST(SmbiosTableTest, ReadsTheSameStructuresAsDmidecode) {
  std::string const dmidecode = OutputOfCommand("PATH=$PATH:/usr/sbin:/sbin command -v dmidecode");
  NEEDS(!dmidecode.empty(), "dmidecode is not installed");
  TTempDir dir;
  std::vector<std::string> files = {ReadFile(SamplePath())};
  for (std::string const& name : kRealTables) {
    files.push_back(EntryPoint32(RealTable(name).size()) + RealTable(name));
    files.push_back(EntryPoint64(RealTable(name).size()) + RealTable(name));
    files.push_back(EntryPointLegacy(RealTable(name).size()) + RealTable(name));
  }
  for (std::string const& file : files) {
    SCOPED_TRACE(file.substr(0, 5));
    WriteFile(dir.Path("dump"), file);
    std::string const report =
        OutputOfCommand(dmidecode.substr(0, dmidecode.find('\n')) + " --from-dump " + dir.Path("dump") + " 2>&1");
    std::vector<std::string> seen, expected;
    std::regex const headLine("DMI type (\\d+), (\\d+) bytes");
    for (std::sregex_iterator match(report.begin(), report.end(), headLine), end; match != end; ++match)
      expected.push_back((*match)[1].str() + " " + (*match)[2].str());

    TStructureReader reader(DmiTableIn(file));
    for (TStructure structure = reader.Next(); !structure.empty(); structure = reader.Next())
      seen.push_back(std::to_string(smbios::TypeOf(structure)) + " " + std::to_string(int{structure[1]}));
    EXPECT_FALSE(expected.empty()) << report;
    EXPECT_EQ(seen, expected);
  }
}

}  // namespace
}  // namespace NQRVZEP20
