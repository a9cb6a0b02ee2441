// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/Connections.h"

#include "tests/Support.h"
#include "tests/providers/controller/FakeController.h"

#include <gtest/gtest.h>
#include <pthread.h>

#include <filesystem>

namespace NQRVZEP20 {
namespace {

TEST(WithinTimeTest, NoCommandIsSentAfterTheLimit) {
  int sent = 0;
  TIpmi const count = [&](TIpmiRequest const&) -> TFinding<std::string> { return std::string(1, static_cast<char>(++sent)); };
  TIpmi const never = WithinTime(count, std::chrono::seconds(0)), soon = WithinTime(count, std::chrono::hours(1));
  EXPECT_EQ(never({6, 1}).Why().fCode, kMissingTimeIsUp);
  EXPECT_EQ(sent, 0);
  EXPECT_TRUE(soon({6, 1}));
}

TEST(WithinTimeTest, NoCommandIsSentAfterOneWithoutAnAnswer) {
  int sent = 0;
  TIpmi const silent = [&](TIpmiRequest const&) -> TFinding<std::string> {
    ++sent;
    return TMissing{kMissingNoAnswer, "silence"};
  };
  TIpmi const limited = WithinTime(silent, std::chrono::hours(1));
  for (int i = 0; i < 3; ++i) EXPECT_EQ(limited({6, 1}).Why().fReason, "silence");
  EXPECT_EQ(sent, 1);
}

// A stack that no address space has room for.
TEST(InThreadsTest, ACommandThatNoThreadCanSendHasAReason) {
  pthread_attr_t attributes;
  ASSERT_EQ(::pthread_getattr_default_np(&attributes), 0);
  std::size_t usual = 0;
  ::pthread_attr_getstacksize(&attributes, &usual);
  ::pthread_attr_setstacksize(&attributes, std::size_t{1} << 47);
  ASSERT_EQ(::pthread_setattr_default_np(&attributes), 0);
  TIpmi const ipmi = [](TIpmiRequest const&) -> TFinding<std::string> { return Bytes({0}); };
  auto const answer = InThreads(ipmi, std::chrono::hours(1))({6, 1});
  ::pthread_attr_setstacksize(&attributes, usual);
  ::pthread_setattr_default_np(&attributes);
  ::pthread_attr_destroy(&attributes);
  ASSERT_FALSE(answer);
  EXPECT_EQ(answer.Why().fReason, "no thread can be started for the controller's commands: Resource temporarily unavailable");
}

TEST(RecordedTest, AnswersAreRecordedAndReadAgain) {
  TTempDir const dir;
  TEnvironmentGuard const recording("ZEP_RECORD_ANSWERS", dir.Path().c_str());
  TIpmi const ipmi = [](TIpmiRequest const&) -> TFinding<std::string> { return Bytes({0, 7}); };
  EXPECT_EQ(*Recorded(ipmi, TMachineFiles("/"))({0x0A, 0x43, Bytes({1, 0xFF})}), Bytes({0, 7}));
  EXPECT_TRUE(std::filesystem::exists(dir.Path("zep-answers/ipmi/0a43-01ff")));
  TIpmi const replayed = Recorded(TIpmi(), TMachineFiles(dir.Path()));
  EXPECT_EQ(*replayed({0x0A, 0x43, Bytes({1, 0xFF})}), Bytes({0, 7}));
  EXPECT_FALSE(replayed({0x0A, 0x24}));
}

// Another program cancels the reservation after the first answer.
TEST(RecordedTest, ARecordingAfterALostReservationIsReadAgain) {
  TTempDir const dir;
  TEnvironmentGuard const recording("ZEP_RECORD_ANSWERS", dir.Path().c_str());
  TIpmi const ipmi = [](TIpmiRequest const& request) -> TFinding<std::string> {
    return request.fData[0] == 7 ? Bytes({kReservationLost}) : Bytes({0, 1, 0});
  };
  TIpmi const recorded = Recorded(ipmi, TMachineFiles("/"));
  TIpmiRequest const first{0x0A, 0x23, Bytes({7, 0, 1, 0, 0, 5})}, second{0x0A, 0x23, Bytes({8, 0, 1, 0, 0, 5})};
  recorded(first);
  recorded(second);
  EXPECT_TRUE(std::filesystem::exists(dir.Path("zep-answers/ipmi/0a23-01000005")));
  TIpmi const replayed = Recorded(TIpmi(), TMachineFiles(dir.Path()));
  EXPECT_EQ(*replayed(first), Bytes({0, 1, 0}));
  EXPECT_EQ(*replayed(second), Bytes({0, 1, 0}));
}

TEST(SessionConnectionTest, AnAnswerOfNoBytesOrTooManyIsNone) {
  static unsigned length;
  TZepController const controller = {
      "s", [](unsigned char, unsigned char, unsigned char const*, unsigned, unsigned char*) { return length; }, nullptr, 1000};
  for (unsigned const bad : {0U, unsigned(kZepControllerAnswerSize) + 1}) {
    length = bad;
    EXPECT_EQ(SessionConnection(controller)({6, 1}).Why().fCode, kMissingNoAnswer);
  }
  length = 2;
  EXPECT_EQ(*SessionConnection(controller)({6, 1}), Bytes({0, 0}));
}

TEST(AskTest, AnAnswerIsCheckedForRefusalAndLength) {
  auto const ask = [](std::string const& answer) {
    return Ask([&](TIpmiRequest const&) -> TFinding<std::string> { return answer; }, {0x0A, 0x20}, 2);
  };
  EXPECT_EQ(*ask(Bytes({0, 1, 2})), Bytes({1, 2}));
  EXPECT_EQ(ask(Bytes({0xC1})).Why().fReason,
            "the controller refused the command 0x20 of network function 0x0a (completion code 0xc1)");
  EXPECT_EQ(ask(Bytes({0, 1})).Why().fReason, "the answer to the command 0x20 of network function 0x0a is too short");
  EXPECT_EQ(ask("").Why().fCode, kMissingUnexpected);
}

}  // namespace
}  // namespace NQRVZEP20
