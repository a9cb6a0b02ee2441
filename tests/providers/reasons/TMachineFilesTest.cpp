// SPDX-License-Identifier: Apache-2.0
#include "providers/reasons/TMachineFiles.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <thread>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::IsEmpty;

class TMachineFilesTest : public testing::Test {
protected:
  void Write(std::string const& path, std::string const& text) const {
    fs::create_directories(fs::path(fRoot + path).parent_path());
    WriteFile(fRoot + path, text);
  }
  void Link(std::string const& target, std::string const& path) const {
    fs::create_directories(fs::path(fRoot + path).parent_path());
    fs::create_symlink(target, fRoot + path);
  }

  // The value, or "code: reason".
  template <class T>
  static std::string Shown(TFinding<T> const& finding) {
    if (!finding) return finding.Why().fCode + ": " + finding.Why().fReason;
    std::ostringstream text;
    text << *finding;
    return text.str();
  }

  TTempDir fDir;
  std::string fRoot = fDir.Path("root");
  TMachineFiles fFiles{fRoot};
};

TEST_F(TMachineFilesTest, ContentIsReadBelowTheRoot) {
  Write("/sys/kernel/notes", "one\ntwo\n");
  EXPECT_EQ(Shown(fFiles.Content("/sys/kernel/notes")), "one\ntwo\n");
  EXPECT_EQ(Shown(TMachineFiles(fRoot + "//").Content("/sys/kernel/notes")), "one\ntwo\n");
}

TEST_F(TMachineFilesTest, TheRootIsThisMachineUnlessTheEnvironmentNamesAnother) {
  TEnvironmentGuard const unset("ZEP_ROOT", nullptr);
  EXPECT_TRUE(TMachineFiles::OfThisProcess().IsThisMachine());
  EXPECT_EQ(TMachineFiles::OfThisProcess().Outside("/sys"), "/sys");
  TEnvironmentGuard const set("ZEP_ROOT", fRoot.c_str());
  EXPECT_FALSE(TMachineFiles::OfThisProcess().IsThisMachine());
  EXPECT_EQ(TMachineFiles::OfThisProcess().Outside("/sys"), fRoot + "/sys");
}

TEST_F(TMachineFilesTest, AMissingFileHasAReason) {
  Write("/file", "x");
  EXPECT_EQ(Shown(fFiles.Content("/sys/none")), "not-given: /sys/none does not exist");
  EXPECT_EQ(Shown(fFiles.Content("/file/below")), "not-given: /file/below does not exist");
}

TEST_F(TMachineFilesTest, OnlyRegularFilesAreRead) {
  fs::create_directories(fRoot + "/directory");
  ASSERT_EQ(::mkfifo((fRoot + "/fifo").c_str(), 0600), 0);
  EXPECT_EQ(Shown(fFiles.Content("/directory")), "unreadable: /directory is not a regular file");
  EXPECT_EQ(Shown(fFiles.Content("/fifo")), "unreadable: /fifo is not a regular file");
}

TEST_F(TMachineFilesTest, AFileOfExactlyTheLimitIsRead) {
  Write("/file", std::string(10000, 'x'));
  EXPECT_EQ(Shown(fFiles.Content("/file", 10000)), std::string(10000, 'x'));
  EXPECT_EQ(Shown(fFiles.Content("/file", 9999)), "unreadable: /file is longer than 9999 bytes");
}

TEST_F(TMachineFilesTest, APartOfAFileMayBeRead) {
  Write("/file", "0123456789");
  EXPECT_EQ(Shown(fFiles.Bytes("/file", 0, 4)), "0123");
  EXPECT_EQ(Shown(fFiles.Bytes("/file", 6, 2)), "67");
  EXPECT_EQ(Shown(fFiles.Bytes("/file", 0, 11)), "0123456789");
  EXPECT_EQ(Shown(fFiles.Bytes("/file", 8, 4)), "89");
  EXPECT_EQ(Shown(fFiles.Bytes("/file", 11, 4)), "");
  EXPECT_EQ(Shown(fFiles.Bytes("/none", 0, 4)), "not-given: /none does not exist");
}

TEST_F(TMachineFilesTest, AFileOfRootNamesRoot) {
  NEEDS(::geteuid() == 0, "root, to become another user");
  Write("/secret", "x");
  ASSERT_EQ(::chmod((fRoot + "/secret").c_str(), 0), 0);
  ASSERT_EQ(::chmod(fDir.Path().c_str(), 0755), 0);
  ASSERT_EQ(::seteuid(65534), 0);
  auto const found = fFiles.Content("/secret");
  ASSERT_EQ(::seteuid(0), 0);
  EXPECT_EQ(Shown(found), "needs-root: only root may read /secret");
}

TEST_F(TMachineFilesTest, LinksAreFollowedWithinTheRoot) {
  Write("/sys/devices/pci0/net/eth0/address", "52:54:00:12:34:56\n");
  Link("../../devices/pci0/net/eth0", "/sys/class/net/eth0");
  Link("/sys/class/net", "/absolute");
  EXPECT_EQ(Shown(fFiles.Line("/sys/class/net/eth0/address")), "52:54:00:12:34:56");
  EXPECT_EQ(Shown(fFiles.Line("/absolute/eth0/address")), "52:54:00:12:34:56");
  EXPECT_EQ(Shown(fFiles.RealPath("/absolute/eth0")), "/sys/devices/pci0/net/eth0");
  EXPECT_EQ(Shown(fFiles.RealName("/absolute/eth0")), "eth0");
}

// The kernel cannot follow ".." while a file is renamed anywhere on the machine, and has to be asked again.
TEST_F(TMachineFilesTest, LinksAreFollowedWhileFilesAreRenamed) {
  Write("/sys/devices/pci0/net/eth0/mtu", "1500\n");
  Link("../../devices/pci0/net/eth0", "/sys/class/net/eth0");
  TTempDir const other;
  WriteFile(other.Path("a"), "");
  std::atomic<bool> isDone{false};
  std::thread renames([&] {
    while (!isDone) {
      std::rename(other.Path("a").c_str(), other.Path("b").c_str());
      std::rename(other.Path("b").c_str(), other.Path("a").c_str());
    }
  });
  int found = 0;
  constexpr int reads = 20000;
  for (int left = reads; left > 0; --left) found += fFiles.Number<unsigned>("/sys/class/net/eth0/mtu") ? 1 : 0;
  isDone = true;
  renames.join();
  EXPECT_EQ(found, reads);
}

TEST_F(TMachineFilesTest, NoLinkLeadsOutOfTheRoot) {
  WriteFile(fDir.Path("outside"), "secret");
  Link(fDir.Path("outside"), "/absolute");
  Link("../../../../../.." + fDir.Path("outside"), "/relative");
  EXPECT_EQ(Shown(fFiles.Content("/absolute")), "not-given: /absolute does not exist");
  EXPECT_EQ(Shown(fFiles.Content("/relative")), "not-given: /relative does not exist");
  EXPECT_EQ(Shown(fFiles.Content("/../outside")), "not-given: /../outside does not exist");
}

TEST_F(TMachineFilesTest, ALineHasNoBlanksAtItsEnds) {
  Write("/model", "  QEMU HARDDISK   \nsecond\n");
  Write("/blank", "  \nsecond\n");
  Write("/zero", std::string("text\0\0", 6));
  EXPECT_EQ(Shown(fFiles.Line("/model")), "QEMU HARDDISK");
  EXPECT_EQ(Shown(fFiles.Line("/blank")), "not-given: /blank is empty");
  EXPECT_EQ(Shown(fFiles.Line("/zero")), "text");
}

TEST_F(TMachineFilesTest, NumbersAreDecimalOrHexadecimal) {
  Write("/n", "12\n");
  EXPECT_EQ(fFiles.Number<unsigned>("/n").Then([](unsigned n) { return n; }).operator*(), 12u);
  struct TRow {
    char const* fText;
    char const* fExpected;
  } const rows[] = {
      {"0\n", "0"}, {"-1\n", "-1"}, {"0x8086\n", "32902"}, {"0xFFff\n", "65535"}, {"2147483647\n", "2147483647"},
  };
  for (TRow const& row : rows) {
    Write("/n", row.fText);
    EXPECT_EQ(Shown(fFiles.Number<int>("/n")), row.fExpected) << row.fText;
  }
  for (char const* text : {"2147483648", "x", "12x", "1 2", "0x", "+1", "1.5"}) {
    Write("/n", text);
    EXPECT_EQ(Shown(fFiles.Number<int>("/n")),
              "unexpected-form: /n contains \"" + std::string(text) + "\", which is not a number in the expected range");
  }
  Write("/n", "1.5");
  EXPECT_EQ(Shown(fFiles.Number<double>("/n")), "1.5");
}

TEST_F(TMachineFilesTest, NamesAreInNumericOrder) {
  for (char const* name : {"eth10", "eth2", "eth1", "lo"}) Write(std::string("/net/") + name, "");
  EXPECT_THAT(fFiles.Names("/net"), ElementsAre("eth1", "eth2", "eth10", "lo"));
  EXPECT_THAT(fFiles.Names("/none"), IsEmpty());
  EXPECT_THAT(fFiles.Names("/net/lo"), IsEmpty());
}

TEST_F(TMachineFilesTest, AnythingMayExist) {
  fs::create_directories(fRoot + "/directory");
  Link("nowhere", "/dangling");
  EXPECT_TRUE(fFiles.Exists("/directory"));
  EXPECT_FALSE(fFiles.Exists("/dangling"));
  EXPECT_FALSE(fFiles.Exists("/none"));
}

TEST_F(TMachineFilesTest, AnAnswerIsRecordedBelowAnotherRoot) {
  Write("/zep-answers/netlink/links", "bytes");
  auto const ask = [] { return TFinding<std::string>("of this machine"); };
  EXPECT_EQ(Shown(fFiles.Answer("netlink/links", ask)), "bytes");
  EXPECT_EQ(Shown(fFiles.Answer("netlink/routes", ask)), "not-given: /zep-answers/netlink/routes does not exist");
  EXPECT_EQ(Shown(TMachineFiles("/").Answer("netlink/links", ask)), "of this machine");
}

TEST_F(TMachineFilesTest, AnAnswerOfThisMachineIsRecorded) {
  TEnvironmentGuard const recording("ZEP_RECORD_ANSWERS", fRoot.c_str());
  TMachineFiles("/").Answer("ethtool/eth0/driver", [] { return TFinding<std::string>(std::string("a\0b\n", 4)); });
  TMachineFiles("/").Answer("netlink/links", [] { return TFinding<std::string>(TMissing{kMissingUnreadable, "refused"}); });
  EXPECT_EQ(ReadFile(fRoot + "/zep-answers/ethtool/eth0/driver"), std::string("a\0b\n", 4));
  EXPECT_FALSE(fs::exists(fRoot + "/zep-answers/netlink"));
}

TEST_F(TMachineFilesTest, ThisMachineHasRealPaths) {
  TMachineFiles const files("/");
  WriteFile(fDir.Path("file"), "x");
  fs::create_symlink("file", fDir.Path("link"));
  EXPECT_EQ(Shown(files.RealPath(fDir.Path("link"))), fs::canonical(fDir.Path("file")).string());
  EXPECT_EQ(Shown(files.RealPath(fDir.Path("none"))), "not-given: " + fDir.Path("none") + " does not exist");
}

TEST_F(TMachineFilesTest, DescriptorsAreClosed) {
  Write("/file", "x");
  auto const count = [] { return std::distance(fs::directory_iterator("/proc/self/fd"), fs::directory_iterator()); };
  auto const before = count();
  for (int i = 0; i < 3; ++i) {
    fFiles.Content("/file"), fFiles.Content("/none"), fFiles.Content("/"), fFiles.Names("/"), fFiles.Names("/file");
    fFiles.Exists("/file"), fFiles.RealPath("/file"), fFiles.RealPath("/none");
  }
  EXPECT_EQ(count(), before);
}

}  // namespace
}  // namespace NQRVZEP20
