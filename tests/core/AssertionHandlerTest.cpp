// SPDX-License-Identifier: Apache-2.0
#include "AssertionHandler.h"

#include "ICIMClass.h"
#include "TBoostAssertException.h"
#include "TZEPException.h"
#include "tests/Support.h"

#include <gtest/gtest.h>

#include <iostream>
#include <locale>
#include <sstream>

namespace NQRVZEP20 {
namespace {

char const* const kMode = "ZEP_BOOST_ASSERT";

// The text that a call prints to standard error.
template <class TFunction>
std::string Printed(TFunction function) {
  testing::internal::CaptureStderr();
  function();
  return testing::internal::GetCapturedStderr();
}

std::string MessageOf(char const* expr, char const* function, char const* file, long line) {
  TEnvironmentGuard const mode(kMode, "throwboost");
  try {
    boost::assertion_failed(expr, function, file, line);
  } catch (TBoostAssertException const& thrown) {
    return thrown.what();
  }
  return "nothing was thrown";
}

TEST(AssertionHandlerTest, ThrowsFailByDefaultAndPrintsNothing) {
  TEnvironmentGuard const mode(kMode, nullptr);
  EXPECT_EQ(Printed([] { EXPECT_STATUS(boost::assertion_failed("px != 0", "f", "a.cpp", 7), kZEPStatusFail); }), "");
}

TEST(AssertionHandlerTest, ThrowsFailInModeThrowzep) {
  TEnvironmentGuard const mode(kMode, "throwzep");
  EXPECT_EQ(Printed([] { EXPECT_STATUS(boost::assertion_failed("px != 0", "f", "a.cpp", 7), kZEPStatusFail); }), "");
}

TEST(AssertionHandlerTest, ThrowboostCarriesTheCompleteMessage) {
  EXPECT_EQ(MessageOf("px != 0", "void f()", "a.cpp", 7), "Boost assertion failure! a.cpp:7 [px != 0] func = void f()");
}

TEST(AssertionHandlerTest, TheLineNumberIsDecimalInEveryLocale) {
  struct TGrouping : std::numpunct<char> {
    char do_thousands_sep() const override { return ','; }
    std::string do_grouping() const override { return "\3"; }
  };
  std::locale const old = std::locale::global(std::locale(std::locale::classic(), new TGrouping));
  std::string const message = MessageOf("px != 0", "f", "a.cpp", 1234567);
  std::locale::global(old);
  EXPECT_EQ(message, "Boost assertion failure! a.cpp:1234567 [px != 0] func = f");
}

TEST(AssertionHandlerTest, ANullArgumentDropsTheRestOfTheMessage) {
  EXPECT_EQ(MessageOf("px != 0", "f", nullptr, 7), "Boost assertion failure! ");
  EXPECT_EQ(MessageOf(nullptr, "f", "a.cpp", 7), "Boost assertion failure! a.cpp:7 [");
  EXPECT_EQ(MessageOf("px != 0", nullptr, "a.cpp", 7), "Boost assertion failure! a.cpp:7 [px != 0] func = ");
}

TEST(AssertionHandlerTest, TrapPrintsAndReturns) {
  TEnvironmentGuard const mode(kMode, "trap");
  EXPECT_EQ(Printed([] { boost::assertion_failed("px != 0", "f", "a.cpp", 7); }),
            "\nBoost assertion failure! a.cpp:7 [px != 0] func = f\n\nForcing segmentation fault.\n");
}

TEST(AssertionHandlerTest, PrintsThroughTheStandardErrorStream) {
  TEnvironmentGuard const mode("ZEP_BOOST_ASSERT", "trap");
  std::ostringstream printed;
  std::streambuf* const old = std::cerr.rdbuf(printed.rdbuf());
  boost::assertion_failed("px != 0", "f()", "file.cpp", 7);
  std::cerr.rdbuf(old);
  EXPECT_EQ(printed.str(), "\nBoost assertion failure! file.cpp:7 [px != 0] func = f()\n\nForcing segmentation fault.\n");
}

TEST(AssertionHandlerTest, ExitPrintsAndExitsWithStatus1) {
  TEnvironmentGuard const mode(kMode, "exit");
  EXPECT_EXIT(boost::assertion_failed("px != 0", "f", "a.cpp", 7), testing::ExitedWithCode(1),
              "^\nBoost assertion failure! a.cpp:7 \\[px != 0\\] func = f\n$");
}

TEST(AssertionHandlerTest, AnyOtherModePrintsAnErrorAndThrowsFail) {
  for (char const* setting : {"THROWZEP", "", " throwzep", "throwzep ", "abort"}) {
    SCOPED_TRACE(setting);
    TEnvironmentGuard const mode(kMode, setting);
    EXPECT_EQ(Printed([] { EXPECT_STATUS(boost::assertion_failed("px != 0", "f", "a.cpp", 7), kZEPStatusFail); }),
              "Invalid setting for ZEP_BOOST_ASSERT '" + std::string(setting) +
                  "'. Valid values are {throwzep, throwboost, trap, exit}.\n");
  }
}

TEST(AssertionHandlerTest, TheFormWithAMessageBehavesTheSame) {
  {
    TEnvironmentGuard const mode(kMode, nullptr);
    EXPECT_STATUS(boost::assertion_failed_msg("px != 0", "why", "f", "a.cpp", 7), kZEPStatusFail);
  }
  TEnvironmentGuard const mode(kMode, "throwboost");
  try {
    boost::assertion_failed_msg("px != 0", "why", "f", "a.cpp", 7);
    ADD_FAILURE() << "nothing was thrown";
  } catch (TBoostAssertException const& thrown) {
    EXPECT_STREQ(thrown.what(), "Boost assertion failure! a.cpp:7 [px != 0] func = f");
  }
}

TEST(AssertionHandlerTest, WritesNothingToTheLog) {
  TEnvironmentGuard const mode(kMode, nullptr);
  TRootObject::GetCoreLogger()->ClearLog();
  EXPECT_STATUS(boost::assertion_failed("px != 0", "f", "a.cpp", 7), kZEPStatusFail);
  EXPECT_TRUE(TRootObject::GetCoreLogger()->GetLog().empty());
}

// Not inlined, because a compiler that sees the empty pointer would warn about its use.
__attribute__((noinline)) boost::shared_ptr<ICIMClass> EmptyPointer() { return boost::shared_ptr<ICIMClass>(); }

TEST(AssertionHandlerTest, UsingAnEmptyPointerCallsTheHandler) {
  boost::shared_ptr<ICIMClass> const empty = EmptyPointer();
  {
    TEnvironmentGuard const mode(kMode, nullptr);
    EXPECT_STATUS(empty->GetName(TCIMContext()), kZEPStatusFail);
  }
  TEnvironmentGuard const mode(kMode, "throwboost");
  try {
    empty->GetName(TCIMContext());
    ADD_FAILURE() << "nothing was thrown";
  } catch (TBoostAssertException const& thrown) {
    EXPECT_NE(std::string(thrown.what()).find(" [px != 0] func = "), std::string::npos) << thrown.what();
  }
}

}  // namespace
}  // namespace NQRVZEP20
