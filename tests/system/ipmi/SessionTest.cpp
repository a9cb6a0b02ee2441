// SPDX-License-Identifier: Apache-2.0

// Tests sessions of libipmiClient.so with other time limits than the library's.

#include "platform/ipmi/TSession.h"

#include "platform/ipmi/Failure.h"
#include "tests/system/ipmi/IpmiBed.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

namespace NQRVZEP20 {
namespace {

using namespace std::chrono_literals;
using testing::ElementsAre;

constexpr int kControllersPort = 6240;
constexpr unsigned char kStorage = 0x0A, kAddEvent = 0x44, kEventLogInfo = 0x40;

class SessionTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(HasIpmiBed(), kIpmiBedNeeds);
    EnterNetworkNamespace();
    StartController();
    fRelay.emplace(623, kControllersPort, [](auto const&) { return TRelay::AtOnce(); });
  }

  void StartController() {
    fSimulator.reset();
    TSimulator::TSettings settings;
    settings.fPort = kControllersPort;
    fSimulator.emplace(settings);
    fSimulator->WaitUntilReady();
  }

  static ipmi::TTarget Target() { return {"127.0.0.1", "623", "zepadmin", "zeppass1"}; }

  // Nothing is repeated, however busy this machine is.
  static ipmi::TTimes Patient() {
    ipmi::TTimes times;
    times.fContact = times.fStep = times.fClose = ipmi::TWaits(3, 20s);
    return times;
  }

  static ipmi::TTimes IdleSoon(ipmi::TTimes times) {
    times.fIdle = 50ms;
    return times;
  }

  static void AddEvent(ipmi::TSession& session) {
    session.Send(kStorage, kAddEvent, {0, 0, 2, 0, 0, 0, 0, 0x41, 0, 4, 1, 1, 0x6F, 1, 2, 3});
  }
  static int Events(ipmi::TSession& session) { return session.Send(kStorage, kEventLogInfo, {}).fData.at(1); }

  // The requests after the first `count`: "query" for one of version 1.5, otherwise the kind of payload.
  std::vector<std::string> RequestsAfter(std::size_t first) const {
    std::map<int, std::string> const kinds = {{0, "message"}, {0x10, "open"}, {0x12, "RAKP 1"}, {0x14, "RAKP 3"}};
    std::vector<std::string> found, all = fRelay->Requests();
    for (std::size_t n = first; n < all.size(); ++n) found.push_back(all[n][4] == 6 ? kinds.at(all[n][5] & 0x3F) : "query");
    return found;
  }

  std::optional<TSimulator> fSimulator;
  std::optional<TRelay> fRelay;
};

TEST_F(SessionTest, ASessionInUseIsKept) {
  ipmi::TSession session(Target(), Patient());
  session.Open();
  AddEvent(session);
  std::size_t const before = fRelay->Requests().size();
  AddEvent(session);
  EXPECT_THAT(RequestsAfter(before), ElementsAre("message"));
}

TEST_F(SessionTest, AnIdleSessionIsRenewedBeforeTheCommandIsSent) {
  ipmi::TSession session(Target(), IdleSoon(Patient()));
  session.Open();
  std::size_t const before = fRelay->Requests().size();
  std::this_thread::sleep_for(100ms);
  AddEvent(session);
  EXPECT_THAT(RequestsAfter(before), ElementsAre("message", "query", "open", "RAKP 1", "RAKP 3", "message", "message"))
      << "closing, opening, setting the privilege, and the command";
  EXPECT_EQ(Events(session), 1);
}

TEST_F(SessionTest, AnIdleSessionThatTheControllerForgotIsRenewedToo) {
  ipmi::TSession session(Target(), IdleSoon({}));
  session.Open();
  StartController();
  std::this_thread::sleep_for(100ms);
  AddEvent(session);
  EXPECT_EQ(Events(session), 1);
}

TEST_F(SessionTest, AControllerThatNeedsTwoSecondsIsNotQueriedAgainMeanwhile) {
  fRelay.reset();
  fRelay.emplace(623, kControllersPort, [](TRelay::TDatagram const& datagram) {
    constexpr unsigned char kProofOfPassword = 0x13;  // RAKP 2
    bool const isSlow = datagram.fIsAnswer && datagram.fBytes[4] == 6 && (datagram.fBytes[5] & 0x3F) == kProofOfPassword;
    return isSlow ? TRelay::TFate{2s} : TRelay::AtOnce();
  });
  ipmi::TSession session(Target());
  session.Open();
  auto const requests = RequestsAfter(0);
  EXPECT_EQ(std::count(requests.begin(), requests.end(), "RAKP 1"), 1);
}

// The library's time limits, shortened: an opening needs more answers than these allow.
TEST_F(SessionTest, AnOpeningEndsAtItsTimeLimit) {
  fRelay.reset();
  fRelay.emplace(623, kControllersPort,
                 [](TRelay::TDatagram const& datagram) { return TRelay::TFate{datagram.fIsAnswer ? 500ms : 0ms}; });
  ipmi::TTimes times;
  times.fWholeOpening = 1200ms;
  ipmi::TSession session(Target(), times);
  auto const start = std::chrono::steady_clock::now();
  EXPECT_THROW(session.Open(), ipmi::TFailure);
  auto const taken = std::chrono::steady_clock::now() - start;
  EXPECT_GE(taken, 1200ms);
  EXPECT_LT(taken, 10s);  // the single steps would wait longer
}

TEST_F(SessionTest, ACommandEndsAtItsTimeLimit) {
  ipmi::TTimes times = Patient();
  times.fCommand = ipmi::TWaits(3, 20s);
  times.fWholeCommand = 1200ms;
  ipmi::TSession session(Target(), times);
  session.Open();
  fSimulator->Stop();
  auto const start = std::chrono::steady_clock::now();
  EXPECT_THROW(AddEvent(session), ipmi::TFailure);
  auto const taken = std::chrono::steady_clock::now() - start;
  EXPECT_GE(taken, 1200ms);
  EXPECT_LT(taken, 15s);
}

TEST_F(SessionTest, AMessageThatIsTooLongForVersion15IsRefusedAndTheSessionContinues) {
  fRelay.reset();
  fRelay.emplace(623, kControllersPort, [](TRelay::TDatagram& datagram) {
    if (datagram.fIsAnswer) datagram.fBytes = WithoutVersion2(datagram.fBytes);
    return TRelay::AtOnce();
  });
  ipmi::TSession session(Target());
  session.Open();
  std::size_t const before = fRelay->Requests().size();
  EXPECT_THROW(session.Send(kStorage, kAddEvent, ipmi::TByteVector(255)), ipmi::TFailure);
  EXPECT_EQ(fRelay->Requests().size(), before);
  AddEvent(session);
  EXPECT_EQ(fRelay->Requests().size(), before + 1) << "in the same session";
}

// ---- Cases that the simulator does not support ----

TEST(EnvelopeTest, BothCipherSuitesAcceptAMessageAndRefuseADamagedOne) {
  struct TRow {
    char const* fName;
    ipmi::TCipherSuite fSuite;
    unsigned fKeySize;
  };
  TRow const rows[] = {{"3", {1, 1, 1}, 20}, {"17", {3, 4, 1}, 32}};
  ASSERT_EQ(::ipmi_rmcpplus_init(), 0);
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fName);
    ipmi::TKeys keys{};
    keys.fSize = row.fKeySize;
    keys.fIntegrity.fill(1);
    keys.fConfidentiality.fill(2);
    ipmi::TEnvelope2 controllers(row.fSuite, keys, 1, 2), clients(row.fSuite, keys, 2, 1);
    ipmi::TPacket const packet = controllers.Pack({0x0B, 9, 0x11, {0, 'd', 'a', 't', 'a'}});
    ipmi::TReply reply;
    ASSERT_EQ(clients.Unpack(packet, reply), ipmi::EVerdict::kAnswer);
    EXPECT_EQ(reply.fSequence, 9);
    EXPECT_EQ(reply.fCommand, 0x11);
    EXPECT_EQ(reply.fData, (ipmi::TByteVector{'d', 'a', 't', 'a'}));
    clients.Accept(reply);
    EXPECT_EQ(clients.Unpack(packet, reply), ipmi::EVerdict::kOther) << "a copy";
    constexpr std::size_t kFirstSigned = 4;  // after the RMCP header
    for (std::size_t place = kFirstSigned; place < packet.size(); ++place) {
      ipmi::TPacket damaged = packet;
      damaged[place] ^= 1;
      EXPECT_NE(ipmi::TEnvelope2(row.fSuite, keys, 2, 1).Unpack(damaged, reply), ipmi::EVerdict::kAnswer) << place;
    }
  }
}

}  // namespace
}  // namespace NQRVZEP20
