// SPDX-License-Identifier: Apache-2.0

// libipmiClient.so over a network that delays, loses, doubles and reorders. What a controller carried out is counted in its
// event log.

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

// The versions that the controller speaks. Only in the older one a message can be read on its way.
enum EVersion { kVersion2, kVersion15 };

class BadNetworkTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(HasIpmiBed(), kIpmiBedNeeds);
    EnterNetworkNamespace();
    StartController();
  }
  void TearDown() override { fClient.close(); }

  void StartController() {
    fSimulator.reset();
    TSimulator::TSettings settings;
    settings.port = kControllersPort;
    fSimulator.emplace(settings);
    fSimulator->WaitUntilReady();
  }

  // Puts a network between the client and the controller. The rule lives longer than the test's own variables.
  void Relay(EVersion version, TRelay::TRule const& rule) {
    fRelay.reset();
    fRelay.emplace(623, kControllersPort, [version, rule](TRelay::TDatagram& datagram) {
      if (version == kVersion15 && datagram.isAnswer) datagram.bytes = WithoutVersion2(datagram.bytes);
      return rule(datagram);
    });
  }

  // How many events the controller logged meanwhile; asked for without the network between.
  int NewEvents() {
    fClient.close();
    fClient.Open(kControllersPort);
    int const before = fEvents;
    fEvents = fClient.Events();
    fClient.close();
    return fEvents - before;
  }

  TIpmiClientLibrary const fClient;
  std::optional<TSimulator> fSimulator;
  std::optional<TRelay> fRelay;
  int fEvents = 0;
};

// ---- One mishap to one packet ----

struct TMishap {
  char const* name;
  EVersion version;
  TFate fate;
};

void PrintTo(TMishap const& mishap, std::ostream* out) { *out << mishap.name; }

class MishapTest : public BadNetworkTest, public testing::WithParamInterface<TMishap> {};

// From the first query to the answer that the session is closed there are 7 requests in version 2.0 and 6 in 1.5.
int PlacesIn(EVersion version) { return version == kVersion2 ? 7 : 6; }

TEST_P(MishapTest, IsGotOverInEveryPlace) {
  TMishap const& mishap = GetParam();
  int const places = PlacesIn(mishap.version), placeOfCommand = places - 2;
  for (bool const isAnswer : {false, true})
    for (int place = 0; place < places; ++place) {
      SCOPED_TRACE((isAnswer ? "answer " : "request ") + std::to_string(place));
      Relay(mishap.version, [&mishap, isAnswer, place](TRelay::TDatagram const& datagram) {
        return datagram.isAnswer == isAnswer && datagram.place == place ? mishap.fate : TRelay::AtOnce();
      });
      EXPECT_EQ(fClient.Open(623), kIpmiClientOk);
      EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
      fClient.close();
      // The simulator carries out what comes twice: a command whose answer was lost, and a copy made on the way. A query
      // that was sent again because this machine is busy moves the places by one.
      bool const mayComeTwice = place >= placeOfCommand && mishap.fate.size() != 1;
      EXPECT_THAT(NewEvents(), testing::AllOf(testing::Ge(1), testing::Le(mayComeTwice ? 2 : 1)));
    }
}

INSTANTIATE_TEST_SUITE_P(All, MishapTest,
                         testing::Values(TMishap{"Loss2", kVersion2, {}}, TMishap{"Loss15", kVersion15, {}},
                                         TMishap{"Copy2", kVersion2, {0ms, 0ms}}, TMishap{"Copy15", kVersion15, {0ms, 0ms}},
                                         TMishap{"LateCopy2", kVersion2, {0ms, 30ms, 300ms}},
                                         TMishap{"LateCopy15", kVersion15, {0ms, 30ms, 300ms}},
                                         TMishap{"Delay2", kVersion2, {1300ms}}, TMishap{"Delay15", kVersion15, {1300ms}}),
                         [](auto const& row) { return row.param.name; });

// ---- Mishaps to many ----

class EachVersionTest : public BadNetworkTest, public testing::WithParamInterface<EVersion> {};

INSTANTIATE_TEST_SUITE_P(All, EachVersionTest, testing::Values(kVersion2, kVersion15),
                         [](auto const& row) { return row.param == kVersion2 ? "Version2" : "Version15"; });

TEST_P(EachVersionTest, EveryPacketMayComeTwice) {
  for (auto const after : {0ms, 20ms}) {
    Relay(GetParam(), [after](auto const&) { return TFate{0ms, after}; });
    ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
    for (int n = 0; n < 5; ++n) EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
    EXPECT_GE(NewEvents(), 5) << "the simulator carries out a copy of the packet before";
  }
}

TEST_P(EachVersionTest, AnswersMayTake3Seconds) {
  Relay(GetParam(), [](auto const& datagram) { return TFate{datagram.isAnswer ? 3000ms : 0ms}; });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).data, "\x07KQ12345");
  EXPECT_EQ(NewEvents(), 1) << "a slow controller gets a command once";
}

TEST_F(BadNetworkTest, BothWaysMayTake3Seconds) {
  Relay(kVersion2, [](auto const&) { return TFate{3000ms}; });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(NewEvents(), 1);
}

// One of five packets is lost, one of five doubled, and all overtake one another.
TEST_P(EachVersionTest, AFifthMayBeLostAndAFifthDoubledAndAllOvertakeOneAnother) {
  for (unsigned seed : {1u, 2u}) {
    SCOPED_TRACE(seed);
    Relay(GetParam(), [random = std::mt19937(seed)](auto const&) mutable {
      unsigned const lot = random() % 5;
      std::chrono::milliseconds const delay(random() % 200), another(random() % 200);
      return lot == 0 ? TFate{} : lot == 1 ? TFate{delay, another} : TFate{delay};
    });
    ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
    EXPECT_EQ(fClient.ReadFru(0x1CC, 7).data, "\x07KQ12345");
    EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
    EXPECT_GE(NewEvents(), 1);
  }
}

TEST_F(BadNetworkTest, AFifthMayBeLostWhereAnswersTake3Seconds) {
  Relay(kVersion2, [random = std::mt19937(7)](auto const& datagram) mutable {
    return random() % 5 == 0 ? TFate{} : TFate{datagram.isAnswer ? 3000ms : 0ms};
  });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).data, "\x07KQ12345");
}

// ---- A command is carried out once ----

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

TEST_F(BadNetworkTest, ACommandThatIsSentAgainHasTheSameRequestNumber) {
  constexpr char kAddEvent = 0x44;
  Relay(kVersion15, [answers = 0](auto const& datagram) mutable {
    bool const isLost = datagram.isAnswer && IsOfCommand(datagram.bytes, kAddEvent) && ++answers <= 2;
    return isLost ? TFate{} : TRelay::AtOnce();
  });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  auto const sent = OfCommand(fRelay->Requests(), kAddEvent);
  ASSERT_EQ(sent.size(), 4u) << "three times the one, once the other";
  std::set<std::string> packetNumbers;
  for (std::string const& request : sent) packetNumbers.insert(request.substr(kPacketNumber, 4));
  EXPECT_EQ(packetNumbers.size(), 4u);
  EXPECT_EQ(sent[1][kRequestNumber], sent[0][kRequestNumber]);
  EXPECT_EQ(sent[2][kRequestNumber], sent[0][kRequestNumber]);
  EXPECT_NE(sent[3][kRequestNumber], sent[0][kRequestNumber]);
}

TEST_P(EachVersionTest, AnIdleSessionIsNoReasonToSendACommandTwice) {
  Relay(GetParam(), [](auto const&) { return TRelay::AtOnce(); });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  std::this_thread::sleep_for(4300ms);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(NewEvents(), 1);
}

TEST_F(BadNetworkTest, AForgottenSessionIsNoReasonToSendACommandInAnother) {
  Relay(kVersion2, [](auto const&) { return TRelay::AtOnce(); });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  StartController();
  std::size_t const before = fRelay->Requests().size();
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientNoAnswer) << "the controller may have carried it out";
  auto const requests = fRelay->Requests();
  EXPECT_GT(requests.size(), before + 1) << "in the session it is sent again";
  for (std::size_t n = before; n < requests.size(); ++n)
    EXPECT_EQ(requests[n][5] & 0x3F, 0) << "nothing but messages is sent: no session is opened";
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk) << "the next command opens one";
  EXPECT_EQ(NewEvents(), 1);
}

// ---- Answers that make no sense ----

TEST_F(BadNetworkTest, AnEchoMakesNoSense) {
  TUdpPeer const echo(623, [](std::string const& datagram) { return datagram; });
  EXPECT_EQ(fClient.Open(623), kIpmiClientFail);
}

TEST_F(BadNetworkTest, AnEchoInEveryLaterPlaceMakesNoSenseEither) {
  int const placeOfCommand = PlacesIn(kVersion2) - 2;
  for (int place = 1; place < placeOfCommand; ++place) {
    SCOPED_TRACE(place);
    Relay(kVersion2, [place, request = std::string()](TRelay::TDatagram& datagram) mutable {
      if (!datagram.isAnswer) request = datagram.bytes;
      if (datagram.isAnswer && datagram.place >= place) datagram.bytes = request;
      return TRelay::AtOnce();
    });
    EXPECT_EQ(fClient.Open(623), kIpmiClientFail);
  }
}

// The simulator takes a copy of RAKP message 1 for the beginning of another session, with less privilege.
TEST_F(BadNetworkTest, APrivilegeThatALateCopyTookAwayIsAskedForAgain) {
  constexpr char kFirstNumber = 0x12;  // RAKP message 1
  Relay(kVersion2, [](auto const& datagram) {
    bool const isCopied = !datagram.isAnswer && datagram.bytes[5] == kFirstNumber;
    return isCopied ? TFate{0ms, 500ms} : TRelay::AtOnce();
  });
  ASSERT_EQ(fClient.Open(623), kIpmiClientOk);
  std::this_thread::sleep_for(1s);
  EXPECT_EQ(fClient.AddEvent(), kIpmiClientOk);
  EXPECT_EQ(NewEvents(), 1);
}

// The controller refuses a proof that does not fit the random number it holds: as after a copy of the step before.
TEST_F(BadNetworkTest, AnOpeningThatGotOutOfStepIsBegunAnew) {
  constexpr char kProof = 0x14;  // RAKP message 3
  auto const proofs = std::make_shared<std::atomic<int>>(0);
  Relay(kVersion2, [proofs](TRelay::TDatagram& datagram) {
    bool const isFirst = !datagram.isAnswer && datagram.bytes[5] == kProof && (*proofs)++ == 0;
    if (isFirst) datagram.bytes.back() = static_cast<char>(datagram.bytes.back() ^ 1);
    return TRelay::AtOnce();
  });
  EXPECT_EQ(fClient.Open(623), kIpmiClientOk);
  EXPECT_GE(*proofs, 2);
  EXPECT_EQ(fClient.ReadFru(0x1CC, 7).data, "\x07KQ12345");
}

}  // namespace
}  // namespace NQRVZEP20
