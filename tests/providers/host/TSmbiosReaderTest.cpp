// SPDX-License-Identifier: Apache-2.0
#include "providers/host/TSmbiosReader.h"

#include "core/Handles.h"
#include "providers/reasons/RecordedMark.h"
#include "tests/SmbiosTables.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <filesystem>
#include <memory>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;

using testing::ElementsAre;
using testing::IsEmpty;

// ---- With the real library ----

class TSmbiosReaderTest : public testing::Test {
protected:
  // Makes a reader of this table.
  void Read(std::string const& table) {
    WriteFile(fDir.Path("table"), table);
    fGuard.reset();
    fGuard = std::make_unique<TEnvironmentGuard>("ZEP_SMBIOS_TABLE", fDir.Path("table").c_str());
    fReader = std::make_unique<TSmbiosReader>();
  }
  void ReadFrom(std::string const& path) {
    fGuard.reset();
    fGuard = std::make_unique<TEnvironmentGuard>("ZEP_SMBIOS_TABLE", path.c_str());
    fReader = std::make_unique<TSmbiosReader>();
  }

  // The text of each structure of that type. Its first field contains the number of the string.
  std::vector<std::string> TextsOf(int type) {
    std::vector<std::string> texts;
    for (TSmbiosStructure const& structure : fReader->All(type)) texts.push_back(*structure.Text(4));
    return texts;
  }

  TTempDir fDir;
  std::unique_ptr<TEnvironmentGuard> fGuard;
  std::unique_ptr<TSmbiosReader> fReader;
};

TEST_F(TSmbiosReaderTest, AllStructuresOfATypeAreReturnedInTableOrder) {
  Read(Structure(17, "\1", {"a"}) + Structure(4, "\1", {"other"}) + Structure(17, "\1", {"b"}) + Structure(17, "\1", {"c"}) +
       EndOfTable());
  EXPECT_THAT(TextsOf(17), ElementsAre("a", "b", "c"));
  EXPECT_THAT(TextsOf(4), ElementsAre("other"));
  EXPECT_THAT(TextsOf(17), ElementsAre("a", "b", "c")) << "a second time";
  EXPECT_EQ(*fReader->First(17).Text(4), "a");
}

TEST_F(TSmbiosReaderTest, AMissingTypeHasItsReason) {
  Read(Structure(4, "\1", {"only"}) + EndOfTable());
  EXPECT_THAT(TextsOf(17), IsEmpty());
  EXPECT_EQ(fReader->WhyNone(17).fCode, "not-given");
  EXPECT_EQ(fReader->WhyNone(17).fReason, "the SMBIOS tables contain no structure of type 17 (Memory Device)");
  EXPECT_EQ(fReader->First(1).Text(4).Why().fReason, "the SMBIOS tables contain no structure of type 1 (System Information)");
}

TEST_F(TSmbiosReaderTest, ManyStructuresAreAllRead) {
  std::string table;
  for (int at = 0; at < 1000; ++at) table += Structure(17, "\1", {"module " + std::to_string(at)});
  Read(table + EndOfTable());
  auto const texts = TextsOf(17);
  ASSERT_EQ(texts.size(), 1000u);
  EXPECT_EQ(texts.back(), "module 999");
}

TEST_F(TSmbiosReaderTest, ALargeStructureIsRead) {
  Read(Structure(1, "\1", {std::string(60000, 'x')}) + EndOfTable());
  EXPECT_EQ(*fReader->First(1).Text(4), std::string(60000, 'x'));
  Read(Structure(1, "\1", {std::string(70000, 'x')}) + EndOfTable());
  EXPECT_EQ(fReader->First(1).Text(4).Why().fCode, "unexpected-form") << "the structure is truncated, so the string has no end";
}

TEST_F(TSmbiosReaderTest, AnUnusableTableFileIsTheReason) {
  ReadFrom(fDir.Path("nothing"));
  EXPECT_EQ(fReader->WhyNone(1).fCode, "unreadable");
  EXPECT_EQ(fReader->WhyNone(1).fReason, "the SMBIOS table file " + fDir.Path("nothing") + " does not exist");
  EXPECT_THAT(fReader->All(17), IsEmpty());
  EXPECT_EQ(fReader->First(1).Byte(4).Why().fReason, fReader->WhyNone(1).fReason);

  ReadFrom(fDir.Path());
  EXPECT_EQ(fReader->WhyNone(1).fReason, "the SMBIOS table file " + fDir.Path() + " does not contain an SMBIOS table");
  Read("");
  EXPECT_EQ(fReader->WhyNone(1).fReason, "the SMBIOS table file " + fDir.Path("table") + " does not contain an SMBIOS table");
}

TEST_F(TSmbiosReaderTest, AReadErrorIsNotReportedAsAFileWithoutATable) {
  ReadFrom("/proc/self/mem");
  EXPECT_EQ(fReader->WhyNone(1).fCode, "unreadable");
  EXPECT_EQ(fReader->WhyNone(1).fReason, "the SMBIOS table file /proc/self/mem cannot be read: Input/output error");

  Read(EndOfTable());  // fReader keeps the library loaded
  TSharedLibrary const library(::dlopen("libsmbios.so", RTLD_NOW));
  ASSERT_TRUE(library) << ::dlerror();
  WriteFile(fDir.Path("other"), EndOfTable());
  rlimit limit;
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &limit), 0);
  rlimit const none{0, limit.rlim_max};
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  ReadFrom(fDir.Path("other"));
  ::setrlimit(RLIMIT_NOFILE, &limit);
  EXPECT_EQ(fReader->WhyNone(1).fCode, "unreadable");
  EXPECT_EQ(fReader->WhyNone(1).fReason, "the SMBIOS table file " + fDir.Path("other") + " cannot be read: Too many open files");
}

TEST_F(TSmbiosReaderTest, TheSourceMarksATableFile) {
  Read(EndOfTable());
  EXPECT_EQ(fReader->SourceOf(17), "SMBIOS type 17 (file)");
  ReadFrom("");
  EXPECT_EQ(fReader->SourceOf(17), "SMBIOS type 17");
}

// A mark of a recording (RecordedMark.h) is not a table: the reason is the one of the recorded machine.
TEST_F(TSmbiosReaderTest, ARefusalInARecordingIsTheReason) {
  struct TRow {
    char const *fMark, *fCode, *fReason;
  } const rows[] = {
      {"refused 13 user", "needs-root", "only root can read the SMBIOS tables"},
      {"refused 5 root", "unreadable", "the system's SMBIOS tables cannot be read: Input/output error"},
  };
  std::string const table = fDir.Path("sys/firmware/dmi/tables/DMI");
  fs::create_directories(fs::path(table).parent_path());
  TEnvironmentGuard const root("ZEP_ROOT", fDir.Path().c_str());
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fMark);
    WriteFile(table, row.fMark);
    ASSERT_EQ(::chmod(table.c_str(), kMarkMode & 07777), 0);
    ReadFrom("");
    EXPECT_EQ(fReader->WhyNone(1).fCode, row.fCode);
    EXPECT_EQ(fReader->WhyNone(1).fReason, row.fReason);
    EXPECT_THAT(fReader->All(17), IsEmpty());
    fs::remove(table);
  }
}

TEST_F(TSmbiosReaderTest, TheRealTablesHaveTheirStructures) {
  for (std::string const& name : kRealTables) {
    SCOPED_TRACE(name);
    ReadFrom(RealTablePath(name));
    EXPECT_EQ(fReader->All(0).size(), 1u);
    EXPECT_EQ(fReader->All(1).size(), 1u);
    EXPECT_EQ(fReader->All(3).size(), 1u);
    EXPECT_EQ(fReader->All(4).size(), 1u);
    EXPECT_EQ(fReader->All(17).size(), 1u);
  }
  ReadFrom(SamplePath());
  EXPECT_EQ(fReader->All(4).size(), 2u);
  EXPECT_EQ(fReader->All(17).size(), 8u);
}

// ---- With a stand-in that has the library's name and is loaded first ----

class FakeSmbiosTest : public testing::Test {
protected:
  void Load(char const* library, char const* behaviour) {
    fReader.reset();
    fLibrary.reset(::dlopen(library, RTLD_NOW));
    ASSERT_TRUE(fLibrary) << ::dlerror();
    fGuard.reset();
    fGuard = std::make_unique<TEnvironmentGuard>("FAKE_SMBIOS", behaviour);
    fReader = std::make_unique<TSmbiosReader>();
  }
  int Closed() { return FunctionOf<int()>(fLibrary.get(), "FakeSmbiosClosed")(); }

  TEnvironmentGuard const fNoFile{"ZEP_SMBIOS_TABLE", nullptr};
  TSharedLibrary fLibrary;
  std::unique_ptr<TEnvironmentGuard> fGuard;
  std::unique_ptr<TSmbiosReader> fReader;
};

TEST_F(FakeSmbiosTest, TheLibrarysStatusIsTheReason) {
  struct TRow {
    char const *fBehaviour, *fCode, *fReason;
  } const rows[] = {
      {"is missing its file", "no-smbios", "the system exports no SMBIOS tables"},
      {"is denied access", "needs-root", "only root can read the SMBIOS tables"},
      {"fails", "unreadable", "the system's SMBIOS tables cannot be read"},
      {"cannot read", "unreadable", "the system's SMBIOS tables cannot be read: Input/output error"},
      {"cannot read and leaves no errno", "unreadable", "the system's SMBIOS tables cannot be read"},
      {"returns no handle", "unreadable", "the system's SMBIOS tables cannot be read"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fBehaviour);
    Load(FAKE_SMBIOS, row.fBehaviour);
    EXPECT_EQ(fReader->WhyNone(1).fCode, row.fCode);
    EXPECT_EQ(fReader->WhyNone(1).fReason, row.fReason);
    EXPECT_EQ(fReader->First(1).Text(5).Why().fCode, row.fCode);
    EXPECT_TRUE(fReader->All(1).empty());
  }
}

TEST_F(FakeSmbiosTest, WithoutGetNextOnlyTheFirstStructureIsRead) {
  Load(FAKE_SMBIOS_WITHOUT_NEXT, "works");
  ASSERT_EQ(fReader->All(1).size(), 1u);
  EXPECT_EQ(*fReader->All(1)[0].Text(5), "first");
}

TEST_F(FakeSmbiosTest, WithGetNextTheOthersFollow) {
  Load(FAKE_SMBIOS, "works");
  ASSERT_EQ(fReader->All(1).size(), 3u);
  EXPECT_EQ(fReader->All(1).size(), 1u) << "the stand-in has already returned its two further structures";
}

TEST_F(FakeSmbiosTest, ALengthOutsideTheBufferIsLimitedToTheBuffer) {
  Load(FAKE_SMBIOS, "reports too large a length");
  EXPECT_EQ(*fReader->First(1).Text(5), "first");
  Load(FAKE_SMBIOS, "reports the length 0");
  EXPECT_EQ(fReader->First(1).Text(5).Why().fCode, "not-given");
  Load(FAKE_SMBIOS, "reports a negative length");
  EXPECT_EQ(fReader->First(1).Text(5).Why().fCode, "not-given");
}

TEST_F(FakeSmbiosTest, ALibraryThatNeverEndsIsReadUpToALimit) {
  Load(FAKE_SMBIOS, "never ends");
  EXPECT_EQ(fReader->All(1).size(), 4096u);
}

TEST_F(FakeSmbiosTest, TheTablesAreClosed) {
  Load(FAKE_SMBIOS, "works");
  int const before = Closed();
  fReader.reset();
  EXPECT_EQ(Closed(), before + 1);
}

}  // namespace
}  // namespace NQRVZEP20
