// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TRecordedFailure.h"

#include "collect/FailureOf.h"
#include "collect/answer/TBadAnswer.h"
#include "collect/answer/TByteReader.h"
#include "collect/answer/TByteWriter.h"
#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

template <class TThrow>
TRecordedFailure ReadAgain(TThrow doThrow) {
  TByteWriter writer;
  try {
    doThrow();
  } catch (...) {
    TRecordedFailure::OfCurrentException().WriteTo(writer);
  }
  TByteReader reader(writer.Bytes());
  return TRecordedFailure::ReadFrom(reader);
}

TEST(TRecordedFailureTest, EveryKindIsThrownAgain) {
  EXPECT_STATUS(ReadAgain([] { throw TZEPException(kZEPStatusAccessDenied); }).Throw(), kZEPStatusAccessDenied);
  EXPECT_EQ(ReasonOf([] { ReadAgain([] { throw TZEPFailure(kZEPStatusFail, "why"); }).Throw(); }), "why");
  EXPECT_EQ(FailureOf([] { ReadAgain([] { throw std::logic_error("text"); }).Throw(); }), "text");
  EXPECT_EQ(FailureOf([] { ReadAgain([] { throw 5; }).Throw(); }), "it threw an object that is not a std::exception");
}

struct TNoText : std::exception {
  char const* what() const noexcept override { return nullptr; }
};

TEST(TRecordedFailureTest, AnExceptionWithoutATextRemainsOne) {
  EXPECT_EQ(FailureOf([] { ReadAgain([] { throw TNoText(); }).Throw(); }), "it threw an exception without a text");
}

TEST(TRecordedFailureTest, ALongTextIsCut) {
  auto const failure = ReadAgain([] { throw std::runtime_error(std::string(5000, 'x')); });
  EXPECT_EQ(FailureOf([&] { failure.Throw(); }), std::string(1021, 'x') + "...");
}

TEST(TRecordedFailureTest, AStatusCodeWithoutATextBecomesFail) {
  EXPECT_STATUS(ReadAgain([] { throw TZEPException(static_cast<EZEPStatusCode>(-7)); }).Throw(), kZEPStatusFail);
  TByteReader reader(std::string_view("\0\x7f\0", 3));
  EXPECT_THROW(TRecordedFailure::ReadFrom(reader), TBadAnswer);
}

}  // namespace
}  // namespace NQRVZEP20
