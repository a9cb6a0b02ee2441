// SPDX-License-Identifier: Apache-2.0

// Tests libipmiClient.so with simulated controllers.

#include "tests/system/ipmi/IpmiBed.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/prctl.h>
#include <sys/wait.h>

#include <chrono>
#include <csignal>
#include <list>
#include <random>

namespace NQRVZEP20 {
namespace {

using namespace std::string_literals;
using TClock = std::chrono::steady_clock;

double SecondsSince(TClock::time_point start) { return std::chrono::duration<double>(TClock::now() - start).count(); }

class IpmiClientTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(HasIpmiBed(), kIpmiBedNeeds);
    EnterNetworkNamespace();
  }
  void TearDown() override { fClient.fClose(); }

  TSimulator& Start(TSimulator::TSettings const& settings = {}) {
    fSimulator.reset();
    fSimulator.emplace(settings);
    fSimulator->WaitUntilReady();
    return *fSimulator;
  }

  TTempDir fDir;
  TIpmiClientLibrary const fClient;
  std::optional<TSimulator> fSimulator;
};

TEST_F(IpmiClientTest, ReadsFruData) {
  Start();
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  auto const read = fClient.ReadFru(0x1AC, 0x1E);
  EXPECT_EQ(read.fResult, kIpmiClientOk);
  EXPECT_EQ(read.fCompletionCode, 0);
  EXPECT_EQ(read.fData,
            "\x1E"
            "1234AB7\0"s +
                std::string(22, ' '));
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345");
}

TEST_F(IpmiClientTest, ARefusedCommandReturnsTheCompletionCode) {
  Start();
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  struct TRow {
    char const* fWhat;
    unsigned fOffset;
    unsigned char fDevice;
    int fCompletionCode;
  };
  TRow const rows[] = {{"an offset after the data", 0x7000, 0, 0xC9}, {"no such device", 0, 9, 0xCC}};
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    auto const read = fClient.ReadFru(row.fOffset, 7, row.fDevice);
    EXPECT_EQ(read.fResult, kIpmiClientCompletionCode);
    EXPECT_NE(read.fCompletionCode, 0);
    EXPECT_NE(read.fCompletionCode, 0xFF);
    EXPECT_EQ(read.fData, "");
  }
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345") << "the session continues";
}

TEST_F(IpmiClientTest, AnAnswerMayBeShorterThanRequested) {
  Start();
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.ReadFru(1024 - 3, 0x1E).fData, "\x03\xFF\xFF\xFF");
}

TEST_F(IpmiClientTest, EachReasonForAFailureToOpenHasItsCode) {
  Start();
  struct TRow {
    char const* fWhat;
    char const *fHost, *fPort, *fUser, *fPassword;
    int fResult;
    double fLongestSeconds;
  };
  std::string const tooLong(21, 'x');
  TRow const rows[] = {
      {"wrong password", "127.0.0.1", "623", "zepadmin", "wrong", kIpmiClientWrongPassword, 3.5},
      {"empty password", "127.0.0.1", "623", "zepadmin", "", kIpmiClientWrongPassword, 3.5},
      {"unknown user", "127.0.0.1", "623", "nobody", "zeppass1", kIpmiClientUnknownUser, 3.5},
      {"disabled user", "127.0.0.1", "623", "zepoff", "offpass", kIpmiClientUnknownUser, 3.5},
      {"closed port", "127.0.0.1", "624", "zepadmin", "zeppass1", kIpmiClientNoAnswer, 3.5},
      {"no route", "192.0.2.1", "623", "zepadmin", "zeppass1", kIpmiClientUnreachable, 3.5},
      {"no such host", "no such host", "623", "zepadmin", "zeppass1", kIpmiClientHostUnknown, 8.5},
      {"no host", "", "623", "zepadmin", "zeppass1", kIpmiClientHostUnknown, 3.5},
      {"a password that is too long", "127.0.0.1", "623", "zepadmin", tooLong.c_str(), kIpmiClientBadArgument, 3.5},
      {"null host", nullptr, "623", "zepadmin", "zeppass1", kIpmiClientBadArgument, 3.5},
      {"null port", "127.0.0.1", nullptr, "zepadmin", "zeppass1", kIpmiClientBadArgument, 3.5},
      {"null user", "127.0.0.1", "623", nullptr, "zeppass1", kIpmiClientBadArgument, 3.5},
      {"null password", "127.0.0.1", "623", "zepadmin", nullptr, kIpmiClientBadArgument, 3.5},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    auto const start = TClock::now();
    EXPECT_EQ(fClient.fOpen(kIpmiClientLan, row.fHost, row.fPort, row.fUser, row.fPassword), row.fResult);
    EXPECT_LT(SecondsSince(start), row.fLongestSeconds);
    EXPECT_EQ(fClient.ReadFru(0, 1).fResult, kIpmiClientNoSession);
  }
  for (int mode : {0, 1, 2, 4, -1})
    EXPECT_EQ(fClient.fOpen(mode, "127.0.0.1", "623", "zepadmin", "zeppass1"), kIpmiClientBadArgument) << mode;
}

TEST_F(IpmiClientTest, OtherAccountsOpenAsWell) {
  Start();
  EXPECT_EQ(fClient.fOpen(kIpmiClientLan, "localhost", "623", "zep16", "abcdefghijklmnop"), kIpmiClientOk);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345");
}

TEST_F(IpmiClientTest, ASilentControllerIsGivenUpAfter7Seconds) {
  TUdpPeer silent(623, [](std::string const&) { return std::nullopt; });
  auto const start = TClock::now();
  EXPECT_EQ(fClient.Open(623), kIpmiClientNoAnswer);
  EXPECT_GT(SecondsSince(start), 6.9);
  EXPECT_LT(SecondsSince(start), 60);
  EXPECT_GT(silent.Received(), 1) << "the query should have been repeated";
}

TEST_F(IpmiClientTest, ASessionWithASilentControllerIsClosedWithin1500Milliseconds) {
  TSimulator const& simulator = Start();
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  simulator.Stop();
  auto const start = TClock::now();
  EXPECT_EQ(fClient.fClose(), kIpmiClientOk);
  EXPECT_GT(SecondsSince(start), 1.4);
  EXPECT_LT(SecondsSince(start), 6);
  simulator.GoOn();
}

TEST_F(IpmiClientTest, TheNextAddressOfAHostIsTriedAfterASilentOne) {
  std::string const hosts = fDir.Path("hosts");
  WriteFile(hosts, "127.0.0.2 twohomes\n127.0.0.1 twohomes\n");
  ASSERT_EQ(::unshare(CLONE_NEWNS), 0);  // for the rest of this process
  ASSERT_EQ(::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr), 0);
  ASSERT_EQ(::mount(hosts.c_str(), "/etc/hosts", nullptr, MS_BIND, nullptr), 0);
  Start();
  ASSERT_EQ(fClient.fOpen(kIpmiClientLan, "twohomes", "623", "zepadmin", "zeppass1"), kIpmiClientOk);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345");
}

TEST_F(IpmiClientTest, GarbageDoesNotOpenASession) {
  std::mt19937 random(5);
  TUdpPeer garbage(623, [&](std::string const&) {
    std::string bytes(random() % 80, '\0');
    for (char& byte : bytes) byte = static_cast<char>(random());
    if (bytes.size() > 3 && random() % 2 == 0) bytes.replace(0, 4, "\x06\0\xFF\x07"s);  // looks like RMCP
    return bytes;
  });
  auto const start = TClock::now();
  EXPECT_NE(fClient.Open(623), kIpmiClientOk);
  EXPECT_LT(SecondsSince(start), 10);
  EXPECT_GT(garbage.Received(), 0);
}

TEST_F(IpmiClientTest, ADamagedAnswerIsNeverAccepted) {
  Start({"127.0.0.1", 6240});
  std::mt19937 random(6);
  TUdpPeer mangler(623, [&](std::string const& datagram) {
    auto answer = AskOf(6240, datagram);
    if (answer && !answer->empty()) (*answer)[random() % answer->size()] ^= static_cast<char>(1 + random() % 255);
    return answer;
  });
  for (int round = 0; round < 3; ++round) {
    auto const start = TClock::now();
    fClient.Open(623);
    std::string const data = fClient.ReadFru(0x1CC, 7).fData;
    EXPECT_TRUE(data == "" || data == "\x07KQ12345") << data;
    EXPECT_LT(SecondsSince(start), 20);
  }
  EXPECT_GT(mangler.Received(), 3);
}

TEST_F(IpmiClientTest, OpeningClosesThePreviousSession) {
  Start();
  // The simulator has room for 63 sessions.
  for (int round = 0; round < 70; ++round) ASSERT_EQ(fClient.Open(623), kIpmiClientOk) << round;
  EXPECT_EQ(fClient.fOpen(kIpmiClientLan, "127.0.0.1", "623", "zepadmin", "wrong"), kIpmiClientWrongPassword);
  EXPECT_EQ(fClient.ReadFru(0, 1).fResult, kIpmiClientNoSession) << "also when opening fails";
}

// A process that keeps a session open until the object is destroyed.
class TSessionHolder {
public:
  explicit TSessionHolder(TIpmiClientLibrary const& client) {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
    TUniqueFd const status(ends[0]), told(ends[1]);
    fProcess = ::fork();
    if (fProcess == 0) {
      ::prctl(PR_SET_PDEATHSIG, SIGKILL);
      char const result = static_cast<char>(client.Open(623));
      (void)!::write(told.get(), &result, 1);
      ::pause();
      ::_exit(0);
    }
    char result = -1;
    (void)!::read(status.get(), &result, 1);
    fResult = result;
  }
  ~TSessionHolder() {
    ::kill(fProcess, SIGKILL);
    ::waitpid(fProcess, nullptr, 0);
  }
  TSessionHolder(TSessionHolder const&) = delete;

  int Result() const { return fResult; }

private:
  pid_t fProcess;
  int fResult;
};

TEST_F(IpmiClientTest, AControllerWithoutAFreeSessionIsBusy) {
  Start();
  constexpr int kRoom = 63;
  std::list<TSessionHolder> holders;
  for (int n = 0; n < kRoom; ++n) ASSERT_EQ(holders.emplace_back(fClient).Result(), kIpmiClientOk) << n;
  EXPECT_EQ(fClient.Open(623), kIpmiClientBusy);
}

TEST_F(IpmiClientTest, ClosingEndsTheSession) {
  Start();
  EXPECT_EQ(fClient.fClose(), 0) << "also without a session";
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.fClose(), 0);
  EXPECT_EQ(fClient.ReadFru(0, 1).fResult, kIpmiClientNoSession);
  EXPECT_EQ(fClient.fClose(), 0);
}

TEST_F(IpmiClientTest, InvalidArgumentsAreRefused) {
  Start();
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  unsigned char bytes[256] = {};
  unsigned short length = 0;
  unsigned char code = 0xFF;
  EXPECT_EQ(fClient.fSend(1, nullptr, 1, bytes, &length, &code, 6), kIpmiClientBadArgument);
  EXPECT_EQ(fClient.fSend(1, bytes, -1, bytes, &length, &code, 6), kIpmiClientBadArgument);
  EXPECT_EQ(fClient.fSend(1, bytes, 256, bytes, &length, &code, 6), kIpmiClientBadArgument);
  EXPECT_EQ(fClient.fSend(1, bytes, 0, nullptr, &length, &code, 6), kIpmiClientBadArgument);
  EXPECT_EQ(fClient.fSend(1, bytes, 0, bytes, nullptr, &code, 6), kIpmiClientBadArgument);
  EXPECT_EQ(fClient.fSend(1, bytes, 0, bytes, &length, nullptr, 6), kIpmiClientBadArgument);
  EXPECT_EQ(fClient.fSend(1, bytes, 0, bytes, &length, &code, 0x1E), kIpmiClientBadArgument) << "a reserved network function";
  EXPECT_EQ(fClient.fSend(1, nullptr, 0, bytes, &length, &code, 6), kIpmiClientOk) << "Get Device ID has no data";
  EXPECT_GT(length, 10);
}

TEST_F(IpmiClientTest, AControllerStoppedDuringASessionIsUsedAgainWhenItContinues) {
  TSimulator const& simulator = Start();
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  ASSERT_EQ(fClient.ReadFru(0x1CC, 7).fResult, kIpmiClientOk);
  simulator.Stop();
  auto const start = TClock::now();
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fResult, kIpmiClientNoAnswer);
  EXPECT_GT(SecondsSince(start), 20.9);
  EXPECT_LT(SecondsSince(start), 30);
  simulator.GoOn();
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345") << "the next command tries again";
}

// ---- A controller with only version 1.5 ----

TEST_F(IpmiClientTest, AControllerWithOnlyVersion15GetsNoVersion2Packets) {
  Start({"127.0.0.1", 6240});
  std::atomic<int> asked2{0};
  TUdpPeer const relay(623, [&](std::string const& datagram) -> std::optional<std::string> {
    constexpr char kAuthenticationTypeOfVersion2 = 6;
    if (datagram.size() > 4 && datagram[4] == kAuthenticationTypeOfVersion2) ++asked2;
    auto const answer = AskOf(6240, datagram);
    return answer ? std::optional(WithoutVersion2(*answer)) : std::nullopt;
  });
  auto const start = TClock::now();
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345");
  EXPECT_LT(SecondsSince(start), 4);
  EXPECT_EQ(fClient.fOpen(kIpmiClientLan, "127.0.0.1", "623", "nobody", "zeppass1"), kIpmiClientUnknownUser);
  EXPECT_EQ(fClient.fOpen(kIpmiClientLan, "127.0.0.1", "623", "zepadmin", "wrong"), kIpmiClientWrongPassword);
  EXPECT_EQ(fClient.fOpen(kIpmiClientLan, "127.0.0.1", "623", "zepadmin", "seventeen letters"), kIpmiClientBadArgument)
      << "version 1.5 has room for 16";
  EXPECT_EQ(asked2, 0) << "nothing was sent in version 2.0";
}

}  // namespace
}  // namespace NQRVZEP20
