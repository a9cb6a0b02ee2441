// SPDX-License-Identifier: Apache-2.0
#include "providers/host/SmbiosVersion.h"

#include "tests/SmbiosTables.h"

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

namespace NQRVZEP20 {
namespace {

std::string VersionText(std::optional<TSmbiosVersion> const& version) {
  return version ? std::to_string(version->first) + "." + std::to_string(version->second) : "none";
}

TEST(SmbiosVersionTest, EveryFormOfEntryPointHasItsVersion) {
  struct TRow {
    std::string fEntryPoint;
    char const* fVersion;
  } const rows[] = {
      {EntryPoint32(100), "2.8"},
      {EntryPoint32(100, 32, 0x1F, 0x203), "2.3"},
      {EntryPoint32(100, 32, 0x1E, 0x205), "2.5"},
      {EntryPoint32(100, 32, 0x1F, 0x206), "2.6"},
      {EntryPoint64(100), "3.3"},
      {EntryPoint64(100, 32, 0x18, 0x305), "3.5"},
      {EntryPointLegacy(100), "2.0"},
      {EntryPointLegacy(100, 32, 0x21), "2.1"},
  };
  for (TRow const& row : rows) {
    EXPECT_EQ(VersionText(VersionInEntryPoint(row.fEntryPoint)), row.fVersion);
    EXPECT_EQ(VersionText(VersionInEntryPoint(row.fEntryPoint + "a table")), row.fVersion);
  }
}

TEST(SmbiosVersionTest, VersionsThatDoNotExistAreCorrected) {
  EXPECT_EQ(VersionText(VersionInEntryPoint(EntryPoint32(100, 32, 0x1F, 0x21F))), "2.3");
  EXPECT_EQ(VersionText(VersionInEntryPoint(EntryPoint32(100, 32, 0x1F, 0x221))), "2.3");
  EXPECT_EQ(VersionText(VersionInEntryPoint(EntryPoint32(100, 32, 0x1F, 0x233))), "2.6");
}

TEST(SmbiosVersionTest, ADamagedEntryPointHasNoVersion) {
  for (std::string const& sound :
       {EntryPoint32(100).substr(0, 0x1F), EntryPoint64(100).substr(0, 0x18), EntryPointLegacy(100).substr(0, 0x0F)}) {
    ASSERT_NE(VersionText(VersionInEntryPoint(sound)), "none");
    for (std::size_t at = 0; at < sound.size(); ++at) {
      std::string damaged = sound;
      damaged[at] = static_cast<char>(damaged[at] + 1);
      EXPECT_EQ(VersionText(VersionInEntryPoint(damaged)), "none") << sound.substr(0, 5) << " " << at;
      EXPECT_EQ(VersionText(VersionInEntryPoint(sound.substr(0, at))), "none") << sound.substr(0, 5) << " " << at;
    }
  }
  for (int length : {0, 0x17, 0x21, 0xFF}) {
    std::string const entryPoint = EntryPoint64(100).replace(6, 1, LittleEndian(length, 1)) + std::string(256, '\0');
    EXPECT_EQ(VersionText(VersionInEntryPoint(WithCheckSum(entryPoint, 5, 0, length))), "none") << length;
  }
}

class VersionOfTablesTest : public testing::Test {
protected:
  std::string VersionOf(std::string const& table) {
    WriteFile(fDir.Path("DMI"), table);
    return VersionText(*VersionOfTables(fDir.Path("DMI")));
  }
  TTempDir fDir;
};

TEST_F(VersionOfTablesTest, ADumpBeginsWithItsEntryPoint) {
  WriteFile(fDir.Path("smbios_entry_point"), EntryPoint64(100));
  EXPECT_EQ(VersionOf(EntryPoint32(100, 32, 0x1F, 0x204) + RealTable("full")), "2.4") << "not the file beside it";
}

TEST_F(VersionOfTablesTest, TheEntryPointOfABareTableIsInItsDirectory) {
  EXPECT_EQ(VersionOf(RealTable("full")), "none");
  WriteFile(fDir.Path("smbios_entry_point"), EntryPoint32(100, 32, 0x1F, 0x204).substr(0, 0x1F));
  EXPECT_EQ(VersionOf(RealTable("full")), "2.4");
  WriteFile(fDir.Path("smbios_entry_point"), EntryPointLegacy(100).substr(0, 0x0F));
  EXPECT_EQ(VersionOf(RealTable("full")), "2.0");
  WriteFile(fDir.Path("smbios_entry_point"), "");
  EXPECT_EQ(VersionOf(RealTable("full")), "none");
}

TEST_F(VersionOfTablesTest, AFileThatCannotBeOpenedIsTheReason) {
  if (kIsSanitized) GTEST_SKIP() << "the sanitizer opens additional descriptors";
  WriteFile(fDir.Path("DMI"), RealTable("full"));
  int const next = ::dup(STDIN_FILENO);
  ::close(next);
  rlimit before{};
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &before), 0);
  rlimit const none{static_cast<rlim_t>(next), before.rlim_max};  // no further descriptor
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  auto const version = VersionOfTables(fDir.Path("DMI"));
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &before), 0);
  ASSERT_FALSE(version);
  EXPECT_EQ(version.Why().fReason, fDir.Path("DMI") + " cannot be read: Too many open files");
}

TEST_F(VersionOfTablesTest, AFileThatCannotBeReadIsTheReason) {
  WriteFile(fDir.Path("DMI"), RealTable("full"));
  std::string const entryPoint = fDir.Path("smbios_entry_point");
  std::filesystem::create_symlink("/proc/self/mem", entryPoint);  // a regular file whose first byte cannot be read
  auto const version = VersionOfTables(fDir.Path("DMI"));
  ASSERT_FALSE(version);
  EXPECT_EQ(version.Why().fReason, entryPoint + " cannot be read: Input/output error");
}

TEST_F(VersionOfTablesTest, APipeDoesNotBlock) {
  ASSERT_EQ(::mkfifo(fDir.Path("smbios_entry_point").c_str(), 0600), 0);
  EXPECT_EQ(VersionOf(RealTable("full")), "none");
}

TEST_F(VersionOfTablesTest, TheRealTablesHaveTheVersionsOfTheirMachines) {
  for (std::string const& name : kRealTables)
    EXPECT_EQ(VersionText(*VersionOfTables(RealTablePath(name))), name == "entry64" ? "3.0" : "2.8") << name;
  EXPECT_EQ(VersionText(*VersionOfTables(SamplePath())), "3.3");
}

}  // namespace
}  // namespace NQRVZEP20
