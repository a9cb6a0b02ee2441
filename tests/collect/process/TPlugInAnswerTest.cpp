// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TPlugInAnswer.h"

#include "collect/process/Costs.h"
#include "providers/memory/TMemoryNamespace.h"
#include "tests/collect/answer/Bytes.h"

#include <gmock/gmock.h>

#include <new>

namespace NQRVZEP20 {
namespace {

using TState = TPlugInAnswer::EState;
using TMessages = std::vector<TMessage>;
using testing::HasSubstr;

std::string const kDisks = BytesOf(TMemoryNamespace("root/disks"));

std::string AsBytes(TMessages const& messages) {
  std::string bytes;
  for (TMessage const& message : messages) bytes += HeadOf(message.fKind, message.fText.size()) + message.fText;
  return bytes;
}

std::string RowOf(TProviderRun const& run) {
  return run.fName + ": " + (run.fView ? "filled " + run.fView->GetName() : run.fError + " (" + run.fStage + ")");
}

// "error (stage)", and the row of each provider.
std::string AsText(TPlugIn const& plugIn) {
  std::string text = plugIn.fError.empty() ? "" : plugIn.fError + " (" + plugIn.fStage + ")";
  for (TProviderRun const& run : plugIn.fProviders) text += (text.empty() ? "" : "; ") + RowOf(run);
  return text;
}

class TPlugInAnswerTest : public testing::Test {
protected:
  TPlugInAnswerTest() { fLimits.fAnswerBytes = 10'000; }

  std::unique_ptr<TPlugInAnswer> Answer() const {
    return std::make_unique<TPlugInAnswer>("Test", "/lib/libTest.nsp.so", fLimits, "", [] { return "[Error] last"; });
  }

  std::unique_ptr<TPlugInAnswer> AnswerOf(TMessages const& messages) const {
    auto answer = Answer();
    answer->Add(AsBytes(messages));
    return answer;
  }

  TApartLimits fLimits;
};

TEST_F(TPlugInAnswerTest, AnAnswerOfAnyMessagesHasAResult) {
  std::string const stage(1, static_cast<char>(EStage::kRegistration));
  struct TRow {
    char const* fName;
    TMessages fMessages;
    TState fState;
    std::string fResult;
  } const rows[] = {
      {"nothing", {}, TState::kOpen, ""},
      {"only the end", {{EMessage::kDone, ""}}, TState::kDone, ""},
      {"a filled namespace",
       {{EMessage::kRegistered, "A"},
        {EMessage::kLoaded, "12"},
        {EMessage::kFilling, "A"},
        {EMessage::kBytes, kDisks},
        {EMessage::kFilled, "3"},
        {EMessage::kDone, ""}},
       TState::kDone,
       "A: filled root/disks"},
      {"a namespace in pieces",
       {{EMessage::kFilling, "A"},
        {EMessage::kBytes, kDisks.substr(0, 3)},
        {EMessage::kBytes, ""},
        {EMessage::kBytes, kDisks.substr(3)},
        {EMessage::kFilled, "3"}},
       TState::kOpen,
       "A: filled root/disks"},
      {"pieces before the provider are dropped",
       {{EMessage::kBytes, "x"}, {EMessage::kFilling, "A"}, {EMessage::kBytes, kDisks}, {EMessage::kFilled, "3"}},
       TState::kOpen,
       "A: filled root/disks"},
      {"a namespace without a provider", {{EMessage::kBytes, kDisks}, {EMessage::kFilled, "3"}}, TState::kOpen, ""},
      {"a broken namespace",
       {{EMessage::kFilling, "A"}, {EMessage::kBytes, "x"}, {EMessage::kFilled, "3"}},
       TState::kOpen,
       "A: a string is longer than the remaining bytes (fill)"},
      {"the classes ahead of the rest",
       {{EMessage::kFilling, "A"},
        {EMessage::kBytes, kDisks},
        {EMessage::kClasses, ""},
        {EMessage::kClasses, ""},
        {EMessage::kFilled, "3"}},
       TState::kOpen,
       "A: filled root/disks"},
      {"classes that are announced, but not complete",
       {{EMessage::kFilling, "A"},
        {EMessage::kBytes, kDisks.substr(0, 3)},
        {EMessage::kClasses, ""},
        {EMessage::kBytes, kDisks.substr(3)},
        {EMessage::kFilled, "3"}},
       TState::kOpen,
       "A: a string is longer than the remaining bytes (fill)"},
      {"classes without a provider", {{EMessage::kClasses, ""}}, TState::kOpen, ""},
      {"a provider that is filled twice",
       {{EMessage::kFilling, "A"},
        {EMessage::kBytes, kDisks},
        {EMessage::kFilled, "3"},
        {EMessage::kFilling, "A"},
        {EMessage::kFailed, "why"}},
       TState::kOpen,
       "A: why (fill); A: filled root/disks"},
      {"a name that is taken",
       {{EMessage::kRegistered, "A"}, {EMessage::kTaken, "A"}, {EMessage::kDone, ""}},
       TState::kDone,
       "A: not filled, because it was registered after the plug-in had been loaded (fill); A: the plug-in registers this name "
       "twice; the second registration is ignored (registration)"},
      {"the first failure of the load counts",
       {{EMessage::kStage, stage}, {EMessage::kFailed, "one"}, {EMessage::kFailed, "two"}},
       TState::kOpen,
       "one (registration)"},
      {"a stage that does not exist", {{EMessage::kStage, "\xff"}, {EMessage::kFailed, "why"}}, TState::kOpen, "why (fill)"},
      {"a failure without a reason", {{EMessage::kFailed, ""}}, TState::kOpen, "it failed without a reason (open)"},
      {"a stage without a byte", {{EMessage::kStage, ""}, {EMessage::kFailed, "why"}}, TState::kOpen, "why (open)"},
      {"a provider that is not filled",
       {{EMessage::kRegistered, "A"}},
       TState::kOpen,
       "A: not filled, because the plug-in process had ended (fill)"},
      {"an end before the namespace is complete",
       {{EMessage::kFilling, "A"}, {EMessage::kBytes, kDisks}, {EMessage::kDone, ""}},
       TState::kDone,
       "A: its result ended before its namespace was complete (fill)"},
      {"nothing counts after the end", {{EMessage::kDone, ""}, {EMessage::kFailed, "why"}}, TState::kDone, ""},
      {"a time that is no number", {{EMessage::kLoaded, "1.5"}, {EMessage::kFailed, "why"}}, TState::kBad, ""},
      {"a time that is negative", {{EMessage::kFilling, "A"}, {EMessage::kFilled, "-1"}}, TState::kBad, ""},
      {"a long name", {{EMessage::kRegistered, std::string(1025, 'A')}}, TState::kBad, ""},
      {"a namespace that is too long", {{EMessage::kBytes, std::string(10'001, 'x')}}, TState::kTooLong, ""},
      {"namespaces that are too long together",
       {{EMessage::kFilling, "A"},
        {EMessage::kBytes, std::string(6'000, 'x')},
        {EMessage::kFilling, "B"},
        {EMessage::kBytes, std::string(6'000, 'x')}},
       TState::kTooLong,
       ""},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fName);
    auto const answer = AnswerOf(row.fMessages);
    EXPECT_EQ(answer->State(), row.fState);
    EXPECT_EQ(AsText(answer->Finish("")), row.fResult);
  }
}

// The memory is filled before, so that a member without a value is noticed.
TEST_F(TPlugInAnswerTest, APlugInThatWasNotLoadedTookNoTime) {
  alignas(TPlugInAnswer) unsigned char memory[sizeof(TPlugInAnswer)];
  for (unsigned char volatile& byte : memory) byte = 0xd2;
  auto* const answer = new (memory) TPlugInAnswer("Test", "/lib/libTest.nsp.so", fLimits, "", [] { return ""; });
  EXPECT_EQ(answer->Finish("").fMilliseconds, 0);
  answer->~TPlugInAnswer();
}

TEST_F(TPlugInAnswerTest, AnAnswerIsTheSameInPiecesOfAnySize) {
  std::string const bytes = AsBytes({{EMessage::kRegistered, "A"},
                                     {EMessage::kLoaded, "12"},
                                     {EMessage::kFilling, "A"},
                                     {EMessage::kBytes, kDisks},
                                     {EMessage::kFilled, "3500"},
                                     {EMessage::kLogsDebug, ""},
                                     {EMessage::kDone, ""}});
  auto const answer = Answer();
  for (char const& byte : bytes) answer->Add({&byte, 1});
  TPlugIn const plugIn = answer->Finish("words");
  EXPECT_EQ(AsText(plugIn), "A: filled root/disks");
  EXPECT_DOUBLE_EQ(plugIn.fMilliseconds, 0.012);
  EXPECT_DOUBLE_EQ(plugIn.fProviders.at(0).fMilliseconds, 3.5);
  EXPECT_EQ(plugIn.fWords, "words");
  EXPECT_TRUE(plugIn.fLogsDebug);
}

TEST_F(TPlugInAnswerTest, WhyAnAnswerIsRefusedIsKnown) {
  EXPECT_EQ(AnswerOf({{EMessage::kLoaded, "soon"}})->WhyBad(), "a time is not a number");
  EXPECT_EQ(AnswerOf({{EMessage::kTaken, std::string(1025, 'A')}})->WhyBad(), "the name of a provider has more than 1024 bytes");
  auto const broken = Answer();
  broken->Add("\xff\xff\xff\xff\xff");
  EXPECT_EQ(broken->State(), TState::kBad);
  EXPECT_EQ(broken->WhyBad(), "malformed message");
}

TEST_F(TPlugInAnswerTest, ProvidersWithoutEndAreRefused) {
  for (EMessage const kind : {EMessage::kRegistered, EMessage::kTaken, EMessage::kFilling}) {
    auto const answer = Answer();
    std::size_t sent = 0;
    for (; answer->State() == TState::kOpen && sent < 2 * kMostProviders; ++sent)
      answer->Add(AsBytes({{kind, "P" + std::to_string(sent)}, {EMessage::kFailed, "why"}}));
    EXPECT_EQ(sent, kMostProviders + 1);
    EXPECT_EQ(answer->WhyBad(), "it registers more than 1000 providers");
    EXPECT_EQ(answer->Finish("").fProviders.size(), kMostProviders);
  }
}

TEST_F(TPlugInAnswerTest, OtherMessagesWithoutEndAreRefused) {
  std::string const failures = AsBytes(TMessages(100, {EMessage::kFailed, std::string(10'000, 'x')}));
  std::string const pieces = AsBytes(TMessages(100'000, {EMessage::kBytes, ""}));
  for (std::string const& bytes : {failures, pieces}) {
    auto const answer = Answer();
    for (int n = 0; n < 100; ++n) answer->Add(bytes);
    EXPECT_EQ(answer->WhyBad(), "its messages exceed 16777216 bytes");
  }
}

TEST_F(TPlugInAnswerTest, CostsBelongToTheirStep) {
  auto const answer = AnswerOf({{EMessage::kCost, BytesOf({"", 0, 0, 10})},
                                {EMessage::kCost, BytesOf({"X_Early", 1, 2, 3})},
                                {EMessage::kFilling, "A"},
                                {EMessage::kCost, BytesOf({"", 0, 0, 20})},
                                {EMessage::kBytes, kDisks},
                                {EMessage::kCost, BytesOf({"X_Disk", 7, 1.5, 30})},
                                {EMessage::kFilled, "3"}});
  TPlugIn const plugIn = answer->Finish("");
  EXPECT_EQ(AsText(plugIn), "A: filled root/disks");
  EXPECT_EQ(plugIn.fPeakBytes, 10u);
  TProviderRun const& run = plugIn.fProviders.at(0);
  EXPECT_EQ(run.fPeakBytes, 20u);
  ASSERT_EQ(run.fCosts.size(), 1u);
  EXPECT_EQ(run.fCosts[0].fClass, "X_Disk");
  EXPECT_EQ(run.fCosts[0].fInstances, 7u);
  EXPECT_DOUBLE_EQ(run.fCosts[0].fMilliseconds, 1.5);
  EXPECT_EQ(run.fCosts[0].fPeakBytes, 30u);
}

TEST_F(TPlugInAnswerTest, TracesCountWhenTheyAreComplete) {
  TMessages messages = {{EMessage::kLeftOpen, "5 (/tmp/x)"}, {EMessage::kLeftRunning, "12 (sleep)"}};
  EXPECT_FALSE(AnswerOf(messages)->Finish("").fTraces);
  messages.push_back({EMessage::kTraced, ""});
  TPlugIn const plugIn = AnswerOf(messages)->Finish("");
  ASSERT_TRUE(plugIn.fTraces);
  EXPECT_EQ(plugIn.fTraces->fDescriptors, std::vector<std::string>{"5 (/tmp/x)"});
  EXPECT_EQ(plugIn.fTraces->fProcesses, std::vector<std::string>{"12 (sleep)"});
}

TEST_F(TPlugInAnswerTest, MeasurementsThatAreWrongOrWithoutEndAreRefused) {
  for (std::string const& cost :
       {std::string(), std::string("\x01"), BytesOf({"X", 1, 1, 1}) + "x", BytesOf({std::string(1025, 'X'), 1, 1, 1})})
    EXPECT_THAT(AnswerOf({{EMessage::kCost, cost}})->WhyBad(), HasSubstr("a cost is invalid: "));
  EXPECT_EQ(AnswerOf(TMessages(kMostTraces, {EMessage::kLeftOpen, "x"}))->WhyBad(), "");
  EXPECT_EQ(AnswerOf(TMessages(kMostTraces + 1, {EMessage::kLeftOpen, "x"}))->WhyBad(),
            "it names more than 100 traces of a kind");
  EXPECT_EQ(AnswerOf(TMessages(kMostClasses + 1, {EMessage::kCost, BytesOf({"X", 1, 1, 1})}))->WhyBad(),
            "there are more than 100000 classes with a cost");
}

TEST_F(TPlugInAnswerTest, AFailureBecauseOfALimitIsMarked) {
  auto const plain = AnswerOf({{EMessage::kFailed, "no disk"}});
  EXPECT_EQ(plain->Finish("").fCause.fLimit, "");
  auto const late = AnswerOf({{EMessage::kFilling, "A"}});
  TPlugInFailure tooLate{"too late"};
  tooLate.fCause.fLimit = "time";
  late->Fail(tooLate);
  TPlugIn const plugIn = late->Finish("");
  EXPECT_EQ(plugIn.fCause.fLimit, "");
  EXPECT_EQ(plugIn.fProviders.at(0).fCause.fLimit, "time");
}

TEST_F(TPlugInAnswerTest, UndefinedSymbolsAreKeptUpToALimit) {
  EXPECT_EQ(AnswerOf({{EMessage::kUndefined, "f"}, {EMessage::kUndefined, "g"}})->Finish("").fUndefinedSymbols,
            (std::vector<std::string>{"f", "g"}));
  EXPECT_EQ(AnswerOf(TMessages(kMostUndefinedSymbols + 1, {EMessage::kUndefined, "f"}))->WhyBad(),
            "it names more than 1000 undefined symbols");
}

TEST_F(TPlugInAnswerTest, ALongFailureIsCut) {
  auto const answer = AnswerOf({{EMessage::kFailed, std::string(1022, 'x') + "\xc3\xa9 and more"}});
  EXPECT_EQ(answer->Finish("").fError, std::string(1021, 'x') + "...");
}

TEST_F(TPlugInAnswerTest, TheAnnouncedEndIsKnown) {
  EXPECT_EQ(AnswerOf({{EMessage::kExits, "7"}})->Ending()->fWhy, "it exited with status 7");
  EXPECT_EQ(AnswerOf({{EMessage::kFatal, "no disk"}})->Ending()->fWhy, "no disk");
  EXPECT_FALSE(AnswerOf({})->Ending());
  EXPECT_EQ(AnswerOf({{EMessage::kExits, "263"}})->Ending()->fCause.fExitStatus, 7);
  EXPECT_EQ(AnswerOf({{EMessage::kExits, "x"}})->Ending()->fCause.fExitStatus, std::nullopt);
  EXPECT_EQ(AnswerOf({{EMessage::kFatal, "no disk"}})->Ending()->fCause.fException, "no disk");
  EXPECT_EQ(AnswerOf({{EMessage::kFatal, "it called std::terminate"}})->Ending()->fCause.fException, "");
}

}  // namespace
}  // namespace NQRVZEP20
