// SPDX-License-Identifier: Apache-2.0

// Tests reading the identity of remote servers from simulated controllers, with the library and with zep.

#include "TOSSpecific.h"
#include "tests/system/ipmi/IpmiBed.h"
#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <set>

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;
using TClock = std::chrono::steady_clock;

double SecondsSince(TClock::time_point start) { return std::chrono::duration<double>(TClock::now() - start).count(); }

class RemoteSystemTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(HasIpmiBed(), kIpmiBedNeeds);
    EnterNetworkNamespace();
  }

  // A FRU image of that size, with the type and model at their place.
  std::string FruOf(std::size_t size) {
    std::string image(size, ' ');
    image.replace(0, 8, "\1\0\0\0\0\0\0\xFF"s);
    image.replace(0x1AC, 8, "1234AB7\0"s);
    WriteFile(fDir.Path("fru"), image);
    return fDir.Path("fru");
  }

  TTempDir fDir;
};

// ---- The library ----

class RemoteLibraryTest : public RemoteSystemTest {
protected:
  // The library searches libipmiClient.so only beside libzepcore.so, where the build puts it.
  static std::vector<std::string> IdentityOf(std::string const& host, std::string const& password = "zeppass1") {
    return {TOSSpecific::GetRemoteMT(host, "zepadmin", password), TOSSpecific::GetRemoteMachineModel(host, "zepadmin", password),
            TOSSpecific::GetRemoteMSN(host, "zepadmin", password)};
  }
};

TEST_F(RemoteLibraryTest, ReadsTheIdentityOfTheControllersServer) {
  TSimulator one({"127.0.0.1", 623}), two({"127.0.0.2", 623, "5678XY1", "ZZ99"});
  one.WaitUntilReady();
  two.WaitUntilReady();
  EXPECT_THAT(IdentityOf("127.0.0.1"), testing::ElementsAre("1234", "AB7", "KQ12345"));
  EXPECT_THAT(IdentityOf("127.0.0.2"), testing::ElementsAre("5678", "XY1", "ZZ99\0  "s)) << "a zero byte ends the serial number";
  EXPECT_THAT(IdentityOf("127.0.0.1", "wrong"), testing::ElementsAre("", "", ""));
}

TEST_F(RemoteLibraryTest, DataThatTheControllerRefusesAreNotAvailable) {
  TSimulator::TSettings settings;
  settings.fFru = FruOf(0x1C0);  // ends before the serial number
  TSimulator simulator(settings);
  simulator.WaitUntilReady();
  EXPECT_THAT(IdentityOf("127.0.0.1"), testing::ElementsAre("1234", "AB7", "N/A"));
}

TEST_F(RemoteLibraryTest, AShortAnswerGivesItsBytes) {
  TSimulator::TSettings settings;
  settings.fFru = FruOf(0x1CC + 3);
  TSimulator simulator(settings);
  simulator.WaitUntilReady();
  EXPECT_EQ(TOSSpecific::GetRemoteMSN("127.0.0.1", "zepadmin", "zeppass1"), "   \0\0\0\0"s);
}

// ---- zep remote ----

class ZepRemoteTest : public RemoteSystemTest {
protected:
  ZepRemoteTest() { fZep.Add("libipmiClient.so", TEST_LIB_DIR "/libipmiClient.so"); }

  zep::TRun Run(std::vector<std::string> arguments, std::string const& password = "zeppass1",
                std::string const& user = "zepadmin") {
    arguments.insert(arguments.begin(), "remote");
    arguments.insert(arguments.end(), {"--user", user});
    zep::TCall call = {arguments};
    call.fEnvironment = {{"ZEP_BMC_PASSWORD", password}};
    call.fHasNoTerminal = true;
    return fZep.Run(call);
  }

  zep::TInstallation fZep;
};

TEST_F(ZepRemoteTest, PrintsTypeModelAndSerialNumber) {
  TSimulator simulator({});
  simulator.WaitUntilReady();
  zep::TRun const run = Run({"127.0.0.1"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput, "Remote server    127.0.0.1\nMachine type     1234\nModel            AB7\nSerial number    KQ12345\n");
  EXPECT_EQ(run.fErrors, "");

  zep::TRun const json = Run({"127.0.0.1", "--json"});
  EXPECT_EQ(json.fStatus, 0);
  zep::ExpectEnvelope(json.fOutput, 0, "zep remote");
  EXPECT_EQ(zep::JsonOf(json)["type"], "1234");
  EXPECT_EQ(zep::JsonOf(json)["model"], "AB7");
  EXPECT_EQ(zep::JsonOf(json)["serialNumber"], "KQ12345");

  WriteFile(fDir.Path("password"), "zeppass1\nnot this line");
  EXPECT_EQ(Run({"127.0.0.1", "--password-file", fDir.Path("password")}, "wrong").fStatus, 0) << "the file takes precedence";
  WriteFile(fDir.Path("password"), "zeppass1\r\n");
  EXPECT_EQ(Run({"127.0.0.1", "--password-file", fDir.Path("password")}, "wrong").fStatus, 0)
      << "a line end written by another system's editor";
}

TEST_F(ZepRemoteTest, AWrongPasswordIsReported) {
  TSimulator simulator({});
  simulator.WaitUntilReady();
  zep::TRun const run = Run({"127.0.0.1"}, "secret7");
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_THAT(run.fErrors, HasSubstr("zep: 127.0.0.1: no session with the controller after N s: wrong password\n"));
  EXPECT_EQ((run.fOutput + run.fErrors).find("secret7"), std::string::npos);
}

TEST_F(ZepRemoteTest, TheReasonOfAMissingSessionIsReported) {
  TSimulator simulator({});
  simulator.WaitUntilReady();
  EXPECT_THAT(Run({"127.0.0.1"}, "zeppass1", "nobody").fErrors, HasSubstr(" s: unknown user, or the account is disabled\n"));
  EXPECT_THAT(Run({"no-such-host.invalid"}).fErrors, HasSubstr(" s: the host name has no address\n"));
  EXPECT_THAT(Run({"198.51.100.1"}).fErrors, HasSubstr(" s: this system cannot send to the host\n"));
  EXPECT_THAT(Run({"127.0.0.2"}).fErrors, HasSubstr(" s: no answer\n"));
}

TEST_F(ZepRemoteTest, AMissingPartIsReported) {
  TSimulator::TSettings settings;
  settings.fFru = FruOf(0x1C0);
  TSimulator simulator(settings);
  simulator.WaitUntilReady();
  zep::TRun const run = Run({"127.0.0.1", "--json"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(zep::JsonOf(run)["type"], "1234");
  EXPECT_TRUE(zep::JsonOf(run)["serialNumber"].is_null());
  zep::ExpectEnvelope(run.fOutput, 2, "zep remote");
  EXPECT_EQ(zep::JsonOf(run)["reason"], "the controller did not report everything");
}

TEST_F(ZepRemoteTest, UnprogrammedFruDataAreReportedAsSuch) {
  struct TRow {
    std::size_t fErasedFrom, fErasedTo;
    char const *fType, *fModel, *fSerialNumber;  // null: none
    int fStatus;
    char const* fError;
  } const rows[] = {
      {0x1AC, 0x200, nullptr, nullptr, nullptr, 1,
       "not programmed in the controller's FRU data (0xFF): machine type, model, serial number"},
      {0x1C0, 0x200, "1234", "AB7", nullptr, 2, "not programmed in the controller's FRU data (0xFF): serial number"},
      {0x1B3, 0x1CC, "1234", "AB7", "KQ12345", 0, nullptr},  // immediately after the model
      {0x1B0, 0x1CC, "1234", nullptr, "KQ12345", 2, "not programmed in the controller's FRU data (0xFF): model"},
  };
  auto const orNull = [](char const* text) { return text != nullptr ? nlohmann::json(text) : nlohmann::json(nullptr); };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fErasedFrom);
    TSimulator::TSettings settings;
    settings.fFru = FruOf(0x200);
    std::string image = ReadFile(settings.fFru).replace(0x1CC, 8, "KQ12345\0"s);
    WriteFile(settings.fFru,
              image.replace(row.fErasedFrom, row.fErasedTo - row.fErasedFrom, row.fErasedTo - row.fErasedFrom, '\xFF'));
    TSimulator simulator(settings);
    simulator.WaitUntilReady();
    zep::TRun const run = Run({"127.0.0.1", "--json"});
    EXPECT_EQ(run.fStatus, row.fStatus);
    auto const document = zep::JsonOf(run);
    EXPECT_EQ(document["type"], orNull(row.fType));
    EXPECT_EQ(document["model"], orNull(row.fModel));
    EXPECT_EQ(document["serialNumber"], orNull(row.fSerialNumber));
    EXPECT_EQ(document.value("error", nlohmann::json(nullptr)), orNull(row.fError));
  }
}

TEST_F(ZepRemoteTest, ThePasswordReachesNeitherOutputNorLog) {
  TSimulator simulator({});
  simulator.WaitUntilReady();
  std::string const log = fDir.Path("log");
  zep::TRun const run = Run({"127.0.0.1", "--debug-log", log});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_THAT(ReadFile(log), HasSubstr("rspBuffer for GetRemoteMSN:"));
  EXPECT_EQ((run.fOutput + run.fErrors + ReadFile(log)).find("zeppass1"), std::string::npos);
}

TEST_F(ZepRemoteTest, AControllerThatAnswersAfter1500MillisecondsIsQueriedWithTheUsualTimeout) {
  constexpr int kControllersPort = 6230;
  TSimulator::TSettings settings;
  settings.fPort = kControllersPort;
  TSimulator simulator(settings);
  simulator.WaitUntilReady();
  TRelay const relay(623, kControllersPort, [](TRelay::TDatagram const& datagram) {
    return TRelay::TFate{std::chrono::milliseconds(datagram.fIsAnswer ? 1500 : 0)};
  });
  zep::TRun const run = Run({"127.0.0.1"});
  EXPECT_EQ(run.fStatus, 0) << run.fErrors;
  EXPECT_THAT(run.fOutput, HasSubstr("Serial number    "));
}

TEST_F(ZepRemoteTest, EachHostHasATimeLimit) {
  TUdpPeer silent(623, [](std::string const&) { return std::nullopt; });
  auto const start = TClock::now();
  zep::TRun const run = Run({"127.0.0.1", "--timeout", "1"});
  EXPECT_LT(SecondsSince(start), 15);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: 127.0.0.1: no result after 1 s; --timeout allows more\n");
}

// The list has controllers that answer, that refuse the account, that are silent, and that cannot be reached.
TEST_F(ZepRemoteTest, AListOfAThousandHostsIsCompletedAlthoughSomeFail) {
  ASSERT_EQ(std::system(
                "ip link add silent0 type veth peer name silent1 && ip link set silent0 arp off up && ip link set silent1 up && "
                "ip addr add 192.0.2.1/24 dev silent0 && ip route add unreachable 198.51.100.0/24"),
            0);
  TSimulator::TSettings settings;
  settings.fAddress = "0.0.0.0";
  TSimulator simulator(settings);  // answers at every address of loopback
  simulator.WaitUntilReady();
  TSimulator::TSettings refusing;
  refusing.fAddress = "127.2.0.1";
  refusing.fPassword = "another";
  TSimulator refuser(refusing);
  refuser.WaitUntilReady();
  std::string hosts;
  for (int n = 0; n < 1000; ++n) {
    std::string const last = std::to_string(n % 200 + 2);
    if (n % 20 == 7)
      hosts += "192.0.2." + last + "\n";  // silent
    else if (n % 20 == 11)
      hosts += "198.51.100." + last + "\n";  // unreachable
    else if (n % 100 == 13)
      hosts += "127.2.0.1\n";  // refuses
    else
      hosts += "127.1." + std::to_string(n / 200) + "." + last + "\n";
  }
  WriteFile(fDir.Path("hosts"), hosts);
  auto const start = TClock::now();
  zep::TRun const run = Run({"--hosts", fDir.Path("hosts"), "--parallel", "50"});
  EXPECT_LT(SecondsSince(start), 180);  // one after the other would take a quarter of an hour
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(run.fErrors, "zep: 1000 of 1000 hosts done, 110 failed\n");
  std::multiset<std::string> told, asked;
  for (std::string const& line : zep::LinesOf(hosts)) asked.insert(line);
  for (std::string const& line : zep::LinesOf(run.fOutput)) {
    auto const json = nlohmann::json::parse(line);
    std::string const host = json["host"];
    told.insert(host);
    bool const isThere = host.rfind("127.1.", 0) == 0;
    EXPECT_EQ(json["serialNumber"].is_null(), !isThere) << line;
    EXPECT_EQ(json.contains("error"), !isThere) << line;
  }
  EXPECT_EQ(told, asked);
}

}  // namespace
}  // namespace NQRVZEP20
