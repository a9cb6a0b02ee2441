// SPDX-License-Identifier: Apache-2.0

// Tests libipmiClient.so over a network that delays, loses, duplicates and reorders packets. The controller's event log counts
// the commands that it has executed.

#include "tests/system/ipmi/IpmiBed.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <random>
#include <set>

namespace NQRVZEP20 {
namespace {

using namespace std::chrono_literals;
using namespace std::string_literals;
using TFate = TRelay::TFate;

constexpr int kControllersPort = 6240;

// The protocol versions of the controller. Only with the older one can the test read messages on their way.
enum EVersion { kVersion2, kVersion15 };

class BadNetworkTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(HasIpmiBed(), kIpmiBedNeeds);
    EnterNetworkNamespace();
    StartController();
  }
  void TearDown() override { fClient.fClose(); }

  void StartController() {
    fSimulator.reset();
    TSimulator::TSettings settings;
    settings.fPort = kControllersPort;
    fSimulator.emplace(settings);
    fSimulator->WaitUntilReady();
  }

  // Places a bad network between the client and the controller. The rule outlives the local variables of the test.
  void Relay(EVersion version, TRelay::TRule const& rule) {
    fRelay.reset();
    fRelay.emplace(623, kControllersPort, [version, rule](TRelay::TDatagram& datagram) {
      if (version == kVersion15 && datagram.fIsAnswer) datagram.fBytes = WithoutVersion2(datagram.fBytes);
      return rule(datagram);
    });
  }

  // The number of events that the controller has logged meanwhile; it is queried without the bad network.
  int NewEvents() {
    fClient.fClose();
    fClient.Open(kControllersPort);
    int const before = fEvents;
    fEvents = fClient.Events();
    fClient.fClose();
    return fEvents - before;
  }

  TIpmiClientLibrary const fClient;
  std::optional<TSimulator> fSimulator;
  std::optional<TRelay> fRelay;
  int fEvents = 0;
};

// ---- One mishap to one packet ----

struct TMishap {
  char const* fName;
  EVersion fVersion;
  TFate fFate;
};

void PrintTo(TMishap const& mishap, std::ostream* out) { *out << mishap.fName; }

class MishapTest : public BadNetworkTest, public testing::WithParamInterface<TMishap> {};

// From the first query to the answer that the session is closed, version 2.0 has 7 requests and version 1.5 has 6.
int PlacesIn(EVersion version) { return version == kVersion2 ? 7 : 6; }

TEST_P(MishapTest, IsOvercomeAtEveryPlace) {
  TMishap const& mishap = GetParam();
  int const places = PlacesIn(mishap.fVersion), placeOfCommand = places - 2;
  for (bool const isAnswer : {false, true})
    for (int place = 0; place < places; ++place) {
      SCOPED_TRACE((isAnswer ? "answer " : "request ") + std::to_string(place));
      Relay(mishap.fVersion, [&mishap, isAnswer, place](TRelay::TDatagram const& datagram) {
        return datagram.fIsAnswer == isAnswer && datagram.fPlace == place ? mishap.fFate : TRelay::AtOnce();
      });
      EXPECT_EQ(fClient.Open(623), kIpmiClientOk);
      EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
      fClient.fClose();
      // The simulator executes a command again that arrives twice: one whose answer was lost, or one that the network copied. A
      // query that is repeated because this machine is busy moves the places by one.
      bool const mayComeTwice = place >= placeOfCommand && mishap.fFate.size() != 1;
      EXPECT_THAT(NewEvents(), testing::AllOf(testing::Ge(1), testing::Le(mayComeTwice ? 2 : 1)));
    }
}

INSTANTIATE_TEST_SUITE_P(All, MishapTest,
                         testing::Values(TMishap{"Loss2", kVersion2, {}}, TMishap{"Loss15", kVersion15, {}},
                                         TMishap{"Copy2", kVersion2, {0ms, 0ms}}, TMishap{"Copy15", kVersion15, {0ms, 0ms}},
                                         TMishap{"LateCopy2", kVersion2, {0ms, 30ms, 300ms}},
                                         TMishap{"LateCopy15", kVersion15, {0ms, 30ms, 300ms}},
                                         TMishap{"Delay2", kVersion2, {1300ms}}, TMishap{"Delay15", kVersion15, {1300ms}}),
                         [](auto const& row) { return row.param.fName; });

// ---- Mishaps to many packets ----

class EachVersionTest : public BadNetworkTest, public testing::WithParamInterface<EVersion> {};

INSTANTIATE_TEST_SUITE_P(All, EachVersionTest, testing::Values(kVersion2, kVersion15),
                         [](auto const& row) { return row.param == kVersion2 ? "Version2" : "Version15"; });

TEST_P(EachVersionTest, EveryPacketMayArriveTwice) {
  for (auto const after : {0ms, 20ms}) {
    Relay(GetParam(), [after](auto const&) { return TFate{0ms, after}; });
    ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
    for (int n = 0; n < 5; ++n) EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
    EXPECT_GE(NewEvents(), 5) << "the simulator also executes a copy of the previous packet";
  }
}

TEST_P(EachVersionTest, AnswersMayTake3Seconds) {
  Relay(GetParam(), [](auto const& datagram) { return TFate{datagram.fIsAnswer ? 3000ms : 0ms}; });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345");
  EXPECT_EQ(NewEvents(), 1) << "a slow controller receives a command once";
}

TEST_F(BadNetworkTest, BothDirectionsMayTake3Seconds) {
  Relay(kVersion2, [](auto const&) { return TFate{3000ms}; });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(NewEvents(), 1);
}

// One of five packets is lost, one of five is duplicated, and their order changes.
TEST_P(EachVersionTest, AFifthMayBeLostAndAFifthDuplicatedAndAllReordered) {
  for (unsigned seed : {1u, 2u}) {
    SCOPED_TRACE(seed);
    Relay(GetParam(), [random = std::mt19937(seed)](auto const&) mutable {
      unsigned const lot = random() % 5;
      std::chrono::milliseconds const delay(random() % 200), another(random() % 200);
      return lot == 0 ? TFate{} : lot == 1 ? TFate{delay, another} : TFate{delay};
    });
    ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
    EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345");
    EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
    EXPECT_GE(NewEvents(), 1);
  }
}

TEST_F(BadNetworkTest, AFifthMayBeLostWhenAnswersTake3Seconds) {
  Relay(kVersion2, [random = std::mt19937(7)](auto const& datagram) mutable {
    return random() % 5 == 0 ? TFate{} : TFate{datagram.fIsAnswer ? 3000ms : 0ms};
  });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345");
}

// ---- A command is executed once ----

// Places in a signed packet of version 1.5.
constexpr std::size_t kAuthentication = 4, kPacketNumber = 5, kMessageOfSession = 30, kRequestNumber = kMessageOfSession + 4,
                      kCommand = kRequestNumber + 1;

bool IsOfCommand(std::string const& datagram, char command) {
  return datagram.size() > kCommand && datagram[kAuthentication] != 0 && datagram[kCommand] == command;
}

std::vector<std::string> OfCommand(std::vector<std::string> datagrams, char command) {
  auto const isAnother = [command](std::string const& datagram) { return !IsOfCommand(datagram, command); };
  datagrams.erase(std::remove_if(datagrams.begin(), datagrams.end(), isAnother), datagrams.end());
  return datagrams;
}

TEST_F(BadNetworkTest, ARepeatedCommandHasTheSameRequestNumber) {
  constexpr char kAddEvent = 0x44;
  Relay(kVersion15, [answers = 0](auto const& datagram) mutable {
    bool const isLost = datagram.fIsAnswer && IsOfCommand(datagram.fBytes, kAddEvent) && ++answers <= 2;
    return isLost ? TFate{} : TRelay::AtOnce();
  });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  auto const sent = OfCommand(fRelay->Requests(), kAddEvent);
  ASSERT_EQ(sent.size(), 4u) << "the first command three times, the second once";
  std::set<std::string> packetNumbers;
  for (std::string const& request : sent) packetNumbers.insert(request.substr(kPacketNumber, 4));
  EXPECT_EQ(packetNumbers.size(), 4u);
  EXPECT_EQ(sent[1][kRequestNumber], sent[0][kRequestNumber]);
  EXPECT_EQ(sent[2][kRequestNumber], sent[0][kRequestNumber]);
  EXPECT_NE(sent[3][kRequestNumber], sent[0][kRequestNumber]);
}

TEST_P(EachVersionTest, AnIdleSessionDoesNotMakeACommandRunTwice) {
  Relay(GetParam(), [](auto const&) { return TRelay::AtOnce(); });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  std::this_thread::sleep_for(4300ms);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(NewEvents(), 1);
}

TEST_F(BadNetworkTest, ACommandIsNotRepeatedInANewSession) {
  Relay(kVersion2, [](auto const&) { return TRelay::AtOnce(); });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  StartController();
  std::size_t const before = fRelay->Requests().size();
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientNoAnswer) << "the controller may have executed it";
  auto const requests = fRelay->Requests();
  EXPECT_GT(requests.size(), before + 1) << "the command is repeated in the same session";
  for (std::size_t n = before; n < requests.size(); ++n)
    EXPECT_EQ(requests[n][5] & 0x3F, 0) << "only messages are sent: no session is opened";
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk) << "the next command opens a session";
  EXPECT_EQ(NewEvents(), 1);
}

// ---- Invalid answers ----

TEST_F(BadNetworkTest, AnEchoIsAnInvalidAnswer) {
  TUdpPeer const echo(623, [](std::string const& datagram) { return datagram; });
  EXPECT_EQ(fClient.Open(623), kIpmiClientFail);
}

TEST_F(BadNetworkTest, AnEchoAtEveryLaterPlaceIsAnInvalidAnswer) {
  int const placeOfCommand = PlacesIn(kVersion2) - 2;
  for (int place = 1; place < placeOfCommand; ++place) {
    SCOPED_TRACE(place);
    Relay(kVersion2, [place, request = std::string()](TRelay::TDatagram& datagram) mutable {
      if (!datagram.fIsAnswer) request = datagram.fBytes;
      if (datagram.fIsAnswer && datagram.fPlace >= place) datagram.fBytes = request;
      return TRelay::AtOnce();
    });
    EXPECT_EQ(fClient.Open(623), kIpmiClientFail);
  }
}

// The simulator treats a copy of RAKP message 1 as the start of another session, with a lower privilege.
TEST_F(BadNetworkTest, APrivilegeLostThroughALateCopyIsRequestedAgain) {
  constexpr char kFirstNumber = 0x12;  // RAKP message 1
  Relay(kVersion2, [](auto const& datagram) {
    bool const isCopied = !datagram.fIsAnswer && datagram.fBytes[5] == kFirstNumber;
    return isCopied ? TFate{0ms, 500ms} : TRelay::AtOnce();
  });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  std::this_thread::sleep_for(1s);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(NewEvents(), 1);
}

// The controller refuses a proof that does not match its random number, as after a copy of the previous step.
TEST_F(BadNetworkTest, AnOpeningWithAWrongProofIsRestarted) {
  constexpr char kProof = 0x14;  // RAKP message 3
  auto const proofs = std::make_shared<std::atomic<int>>(0);
  Relay(kVersion2, [proofs](TRelay::TDatagram& datagram) {
    bool const isFirst = !datagram.fIsAnswer && datagram.fBytes[5] == kProof && (*proofs)++ == 0;
    if (isFirst) datagram.fBytes.back() = static_cast<char>(datagram.fBytes.back() ^ 1);
    return TRelay::AtOnce();
  });
  EXPECT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_GE(*proofs, 2);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).fData, "\x07KQ12345");
}

}  // namespace
}  // namespace NQRVZEP20
