// SPDX-License-Identifier: Apache-2.0

// Tests libsmbios.so through its C functions; it is loaded in the same way as the core loads it.

#include "platform/include/smbios.h"

#include "core/Handles.h"
#include "tests/SmbiosTables.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>

#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <thread>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::UnorderedElementsAre;

static_assert(int{kSmbiosOk} == kZEPStatusOK && int{kSmbiosFail} == kZEPStatusFail &&
              int{kSmbiosOutOfMemory} == kZEPStatusOutOfMemory && int{kSmbiosNoMoreItems} == kZEPStatusNoMoreItems &&
              int{kSmbiosFileSystemError} == kZEPStatusFileSystemError && int{kSmbiosFileNotFound} == kZEPStatusFileNotFound &&
              int{kSmbiosAccessDenied} == kZEPStatusAccessDenied);

class SmbiosLibraryTest : public testing::Test {
protected:
  void SetUp() override {
    ASSERT_TRUE(fLibrary) << ::dlerror();
    ASSERT_TRUE(fLoad && fGetFirst && fGetNext && fClose);
  }

  // The status of loading a file with these contents; the handle is closed again.
  int LoadStatus(std::string const& contents) {
    WriteFile(fDir.Path("table"), contents);
    return LoadStatusOfPath(fDir.Path("table"));
  }
  int LoadStatusOfPath(std::string const& path) {
    TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", path.c_str());
    void* handle = this;
    int const status = fLoad(nullptr, &handle);
    EXPECT_EQ(handle == nullptr, status != kSmbiosOk);
    EXPECT_EQ(fClose(handle), kSmbiosOk);
    return status;
  }

  using THandle = std::unique_ptr<void, decltype(&smBiosClose)>;

  THandle Open(std::string const& contents) {
    WriteFile(fDir.Path("table"), contents);
    TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", fDir.Path("table").c_str());
    void* handle = nullptr;
    EXPECT_EQ(fLoad(nullptr, &handle), kSmbiosOk);
    return THandle(handle, fClose);
  }

  // The result of a call with a buffer of that size, as "status length bytes".
  template <class TGet>
  std::string Got(TGet get, THandle const& handle, int type, int size = 4096) {
    std::vector<char> buffer(static_cast<std::size_t>(size) + 8, '#');
    int length = size;
    int const status = get(handle.get(), type, buffer.data(), &length);
    std::string const bytes(buffer.data(), buffer.size());
    EXPECT_EQ(bytes.substr(static_cast<std::size_t>(size)), "########") << "written after the end of the buffer";
    if (status != kSmbiosOk) {
      EXPECT_EQ(length, size) << "a failure changes nothing";
      EXPECT_EQ(bytes, std::string(buffer.size(), '#'));
      return "status " + std::to_string(status);
    }
    return std::to_string(length) + " " + bytes.substr(0, static_cast<std::size_t>(std::min(length, size)));
  }
  std::string First(THandle const& handle, int type, int size = 4096) { return Got(fGetFirst, handle, type, size); }
  std::string Next(THandle const& handle, int type, int size = 4096) { return Got(fGetNext, handle, type, size); }

  TTempDir fDir;
  TSharedLibrary fLibrary{::dlopen(ZEP_SMBIOS_LIBRARY, RTLD_NOW)};
  decltype(&smBiosLoad) fLoad = FunctionOf<decltype(smBiosLoad)>(fLibrary.get(), "smBiosLoad");
  decltype(&smBiosGetFirst) fGetFirst = FunctionOf<decltype(smBiosGetFirst)>(fLibrary.get(), "smBiosGetFirst");
  decltype(&smBiosGetNext) fGetNext = FunctionOf<decltype(smBiosGetNext)>(fLibrary.get(), "smBiosGetNext");
  decltype(&smBiosClose) fClose = FunctionOf<decltype(smBiosClose)>(fLibrary.get(), "smBiosClose");
};

std::string Whole(std::string const& structure) { return std::to_string(structure.size()) + " " + structure; }

TEST_F(SmbiosLibraryTest, ExportsItsFunctionsAndNothingElse) {
  std::istringstream symbols(OutputOfCommand("nm -D --defined-only --format=just-symbols " ZEP_SMBIOS_LIBRARY));
  std::vector<std::string> names;
  for (std::string name; symbols >> name;) names.push_back(name);
  NEEDS(!names.empty(), "nm is not installed");
  EXPECT_THAT(names, UnorderedElementsAre("smBiosLoad", "smBiosGetFirst", "smBiosGetNext", "smBiosClose"));
}

TEST_F(SmbiosLibraryTest, NeedsNothingOfTheCore) {
  std::string const needed = OutputOfCommand("readelf -d " ZEP_SMBIOS_LIBRARY);
  NEEDS(needed.find("NEEDED") != needed.npos, "readelf is not installed");
  EXPECT_EQ(needed.find("zepcore"), needed.npos);
}

TEST_F(SmbiosLibraryTest, ReadsRealTables) {
  struct TRow {
    char const* fName;
    std::string fProduct, fSerial, fBios;
  };
  TRow const rows[] = {
      {"full", "Server Q100 -[1234AB7]-", "KQ12345", "-[ABE123CUS-1.10]-"},
      {"bare7", "1234AB7", "KQ12345", "ABE123C"},
      {"eight", "1234AB78", "KQ12345", "7"},
      {"no-serial", "Server-[5678XY1]-", "pc-i440fx-7.2", "-[ABE123CUS-1.10]-"},
      {"two-dashes", "Rack-Server Q200 -[5678XY1]-", "KQ 99", "-[ABE123CUS-1.10]-"},
      {"qemu-own", "Standard PC (i440FX + PIIX, 1996)", "pc-i440fx-7.2", "-[ABE123CUS-1.10]-"},
      {"entry64", "Server Q100 -[1234AB7]-", "KQ12345", "-[ABE123CUS-1.10]-"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fName);
    THandle const handle = Open(RealTable(row.fName));
    std::string const bios = First(handle, 0);
    std::string const system = First(handle, 1);
    EXPECT_NE(bios.find(row.fBios + "\0\0"s), bios.npos) << "the last string, followed by the double zero";
    EXPECT_NE(system.find("\0"s + row.fProduct + "\0"s), system.npos);
    EXPECT_NE(system.find("\0"s + row.fSerial + "\0\0"s), system.npos);
  }
}

TEST_F(SmbiosLibraryTest, ReadsDumpsWithEntryPointsOfAllForms) {
  std::string const table = RealTable("full");
  std::string const system = First(Open(table), 1);
  EXPECT_EQ(First(Open(EntryPoint32(table.size()) + table), 1), system);
  EXPECT_EQ(First(Open(EntryPoint64(table.size()) + table), 1), system);
  EXPECT_EQ(First(Open(EntryPointLegacy(table.size()) + table), 1), system);
}

TEST_F(SmbiosLibraryTest, EachFailureOfLoadHasItsStatus) {
  std::string const table = RealTable("full");
  struct TRow {
    char const* fWhat;
    std::string fContents;
    int fStatus;
  };
  TRow const rows[] = {
      {"a table", table, kSmbiosOk},
      {"noise", std::string(65536, '\xA5'), kSmbiosOk},
      {"one byte", "x", kSmbiosOk},
      {"an empty file", "", kSmbiosFail},
      {"an entry point with a wrong checksum", "_SM3_!" + EntryPoint64(table.size()).substr(6) + table, kSmbiosFail},
      {"an entry point and no table", EntryPoint32(100), kSmbiosFail},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(LoadStatus(row.fContents), row.fStatus);
  }
  EXPECT_EQ(LoadStatusOfPath(fDir.Path("absent")), kSmbiosFileNotFound);
  EXPECT_EQ(LoadStatusOfPath(fDir.Path("table/below a file")), kSmbiosFileNotFound);
  EXPECT_EQ(LoadStatusOfPath(fDir.Path()), kSmbiosFail) << "a directory";
  EXPECT_EQ(LoadStatusOfPath("/dev/zero"), kSmbiosFail) << "a device is not a regular file";
}

TEST_F(SmbiosLibraryTest, LoadOfAFileThatCannotBeReadLeavesTheReasonInErrno) {
  EXPECT_EQ(LoadStatusOfPath("/proc/self/mem"), kSmbiosFileSystemError) << "the read fails";
  EXPECT_EQ(errno, EIO);

  WriteFile(fDir.Path("table"), RealTable("full"));
  rlimit limit;
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &limit), 0);
  rlimit const none{0, limit.rlim_max};
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  int const status = LoadStatusOfPath(fDir.Path("table")), error = errno;
  ::setrlimit(RLIMIT_NOFILE, &limit);
  EXPECT_EQ(status, kSmbiosFileSystemError) << "no descriptor left";
  EXPECT_EQ(error, EMFILE);
}

TEST_F(SmbiosLibraryTest, LoadDoesNotWaitForAWriterOfAPipe) {
  ASSERT_EQ(::mkfifo(fDir.Path("fifo").c_str(), 0600), 0);
  EXPECT_EQ(LoadStatusOfPath(fDir.Path("fifo")), kSmbiosFail);
}

TEST_F(SmbiosLibraryTest, LoadWithoutTheRightToReadIsAccessDenied) {
  WriteFile(fDir.Path("secret"), RealTable("full"));
  ASSERT_EQ(::chmod(fDir.Path("secret").c_str(), 0), 0);
  ASSERT_EQ(::chmod(fDir.Path().c_str(), 0755), 0);
  pid_t const child = ::fork();
  if (child == 0) {
    constexpr int kNobody = 65534, kNotRun = 255;
    if (::geteuid() == 0 && ::setresuid(kNobody, kNobody, kNobody) != 0) ::_exit(kNotRun);
    ::setenv("ZEP_SMBIOS_TABLE", fDir.Path("secret").c_str(), 1);
    void* handle = nullptr;
    ::_exit(fLoad(nullptr, &handle));
  }
  int status = 0;
  ASSERT_EQ(::waitpid(child, &status, 0), child);
  ASSERT_TRUE(WIFEXITED(status));
  EXPECT_EQ(WEXITSTATUS(status), kSmbiosAccessDenied);
}

TEST_F(SmbiosLibraryTest, WithoutTheVariableTheKernelsTablesAreRead) {
  constexpr char const* kKernelTable = "/sys/firmware/dmi/tables/DMI";
  for (char const* variable : {static_cast<char const*>(nullptr), ""}) {
    TEnvironmentGuard const none("ZEP_SMBIOS_TABLE", variable);
    void* handle = nullptr;
    int const status = fLoad(nullptr, &handle);
    THandle const opened(handle, fClose);
    if (::access(kKernelTable, F_OK) != 0) {
      EXPECT_EQ(status, kSmbiosFileNotFound);
    } else if (::access(kKernelTable, R_OK) != 0) {
      EXPECT_EQ(status, kSmbiosAccessDenied);
    } else {
      EXPECT_EQ(status, kSmbiosOk);
      EXPECT_EQ(First(opened, 1), First(Open(ReadFile(kKernelTable)), 1));
    }
  }
}

TEST_F(SmbiosLibraryTest, EachLoadReadsTheVariable) {
  THandle const first = Open(Structure(1, "first"));
  THandle const second = Open(Structure(1, "second"));
  EXPECT_EQ(First(first, 1), Whole(Structure(1, "first"))) << "a handle keeps its own copy";
  EXPECT_EQ(First(second, 1), Whole(Structure(1, "second")));
}

// The library caches the file that it read last, once the file has been unchanged for a while.
TEST_F(SmbiosLibraryTest, AChangedFileIsReadAgain) {
  EXPECT_EQ(First(Open(Structure(1, "one")), 1), Whole(Structure(1, "one")));
  EXPECT_EQ(First(Open(Structure(1, "two")), 1), Whole(Structure(1, "two"))) << "changed immediately, with the same size";

  std::this_thread::sleep_for(std::chrono::milliseconds(2100));
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", fDir.Path("table").c_str());
  for (int time = 0; time < 3; ++time) {
    void* handle = nullptr;
    ASSERT_EQ(fLoad(nullptr, &handle), kSmbiosOk);
    EXPECT_EQ(First(THandle(handle, fClose), 1), Whole(Structure(1, "two"))) << "unchanged";
  }
  EXPECT_EQ(First(Open(Structure(1, "six")), 1), Whole(Structure(1, "six"))) << "changed after it was cached";
  std::filesystem::remove(fDir.Path("table"));
  EXPECT_EQ(LoadStatusOfPath(fDir.Path("table")), kSmbiosFileNotFound);
}

TEST_F(SmbiosLibraryTest, ThreadsOpenAndReadAtOnce) {
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", RealTablePath("full").c_str());
  std::string const system = First(Open(RealTable("full")), 1);
  std::vector<std::thread> threads;
  std::atomic<int> right{0};
  for (int thread = 0; thread < 4; ++thread)
    threads.emplace_back([&] {
      for (int time = 0; time < 200; ++time) {
        void* handle = nullptr;
        if (fLoad(nullptr, &handle) == kSmbiosOk) right += First(THandle(handle, fClose), 1) == system;
      }
    });
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(right, 800);
}

TEST_F(SmbiosLibraryTest, TheProviderArgumentIsIgnored) {
  WriteFile(fDir.Path("table"), RealTable("full"));
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", fDir.Path("table").c_str());
  void* handle = nullptr;
  EXPECT_EQ(fLoad(reinterpret_cast<void*>(1), &handle), kSmbiosOk);
  EXPECT_EQ(fClose(handle), kSmbiosOk);
}

TEST_F(SmbiosLibraryTest, OnlyTheFirst16MiBOfAHugeFileAreRead) {
  constexpr std::size_t kLimit = 16u << 20;
  std::string const filler = Structure(2, ""), last = Structure(3, "");
  std::string table;
  while (table.size() + filler.size() + last.size() <= kLimit) table += filler;
  EXPECT_EQ(First(Open(table + last), 3), Whole(last)) << "this structure ends at or before the limit";
  EXPECT_EQ(First(Open(table + filler + last), 3), "status 5") << "this structure extends beyond the limit";
}

TEST_F(SmbiosLibraryTest, GetFirstReturnsTheFirstStructureOfAType) {
  THandle const handle = Open(Structure(0, "a") + Structure(1, "b", {"one"}) + Structure(1, "c") + EndOfTable());
  EXPECT_EQ(First(handle, 0), Whole(Structure(0, "a")));
  EXPECT_EQ(First(handle, 1), Whole(Structure(1, "b", {"one"})));
  EXPECT_EQ(First(handle, 1), Whole(Structure(1, "b", {"one"}))) << "always the first structure";
  EXPECT_EQ(First(handle, 127), Whole(EndOfTable()));
}

TEST_F(SmbiosLibraryTest, AMissingTypeReturnsNoMoreItems) {
  THandle const handle = Open(RealTable("full"));
  for (int type : {2, 126, 255, 256, 257, -1, 1 << 30}) EXPECT_EQ(First(handle, type), "status 5") << type;
  for (int type : {2, 255, 256, -1}) EXPECT_EQ(Next(handle, type), "status 5") << type;
}

TEST_F(SmbiosLibraryTest, AStructureIsCutToTheBufferAndItsLengthReported) {
  std::string const structure = Structure(1, "fields", {"one", "two"});
  THandle const handle = Open(structure);
  for (std::size_t size = 0; size <= structure.size() + 1; ++size) {
    SCOPED_TRACE(size);
    EXPECT_EQ(First(handle, 1, static_cast<int>(size)), std::to_string(structure.size()) + " " + structure.substr(0, size));
  }
  int length = 0;
  EXPECT_EQ(fGetFirst(handle.get(), 1, nullptr, &length), kSmbiosOk);
  EXPECT_EQ(length, static_cast<int>(structure.size()));
}

TEST_F(SmbiosLibraryTest, InvalidArgumentsAreRefused) {
  THandle const handle = Open(RealTable("full"));
  char buffer[16] = {};
  for (auto const get : {fGetFirst, fGetNext}) {
    int length = sizeof buffer;
    EXPECT_EQ(get(nullptr, 1, buffer, &length), kSmbiosFail);
    EXPECT_EQ(get(handle.get(), 1, buffer, nullptr), kSmbiosFail);
    EXPECT_EQ(get(handle.get(), 1, nullptr, &length), kSmbiosFail);
    EXPECT_EQ(length, 16);
    length = -1;
    EXPECT_EQ(get(handle.get(), 1, buffer, &length), kSmbiosFail);
    EXPECT_EQ(length, -1);
  }
  EXPECT_EQ(fLoad(nullptr, nullptr), kSmbiosFail);
  EXPECT_EQ(fClose(nullptr), kSmbiosOk);
}

TEST_F(SmbiosLibraryTest, GetNextReturnsTheStructuresOfATypeOneByOne) {
  THandle const handle =
      Open(Structure(17, "a") + Structure(4, "b") + Structure(17, "c") + Structure(4, "d") + EndOfTable() + Structure(17, "e"));
  EXPECT_EQ(First(handle, 17), Whole(Structure(17, "a")));
  EXPECT_EQ(Next(handle, 17), Whole(Structure(17, "c")));
  EXPECT_EQ(Next(handle, 17), "status 5");
  EXPECT_EQ(Next(handle, 4), Whole(Structure(4, "d"))) << "the search starts after the structure copied last, whatever its type";
  EXPECT_EQ(Next(handle, 127), Whole(EndOfTable()));
  EXPECT_EQ(Next(handle, 17), "status 5") << "nothing is read after the end-of-table structure";
  EXPECT_EQ(First(handle, 4), Whole(Structure(4, "b"))) << "GetFirst starts again from the beginning";
  EXPECT_EQ(Next(handle, 4), Whole(Structure(4, "d")));
}

TEST_F(SmbiosLibraryTest, GetNextOnANewHandleStartsWithTheFirstStructure) {
  THandle const handle = Open(Structure(4, "a") + Structure(4, "b"));
  EXPECT_EQ(Next(handle, 4), Whole(Structure(4, "a")));
  EXPECT_EQ(Next(handle, 4), Whole(Structure(4, "b")));
  EXPECT_EQ(Next(handle, 4), "status 5");
}

TEST_F(SmbiosLibraryTest, ASearchThatFindsNothingKeepsThePosition) {
  THandle const handle = Open(Structure(4, "a") + Structure(17, "b") + Structure(4, "c"));
  EXPECT_EQ(First(handle, 4), Whole(Structure(4, "a")));
  EXPECT_EQ(First(handle, 9), "status 5");
  EXPECT_EQ(Next(handle, 9), "status 5");
  EXPECT_EQ(Next(handle, 17), Whole(Structure(17, "b")));
}

TEST_F(SmbiosLibraryTest, TheSampleDescribesACompleteServer) {
  THandle const handle = Open(ReadFile(SamplePath()));
  std::vector<int> counts;
  for (int type : {0, 1, 2, 3, 4, 16, 17, 127}) {
    int count = First(handle, type) == "status 5" ? 0 : 1;
    while (count > 0 && Next(handle, type) != "status 5") ++count;
    counts.push_back(count);
  }
  EXPECT_THAT(counts, ElementsAre(1, 1, 1, 1, 2, 1, 8, 1));
}

}  // namespace
}  // namespace NQRVZEP20
