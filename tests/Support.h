// SPDX-License-Identifier: Apache-2.0
#pragma once

// Helpers that the tests of all rooms share.

#include "ILogger.h"
#include "TLogger.h"
#include "TRootObject.h"
#include "TZEPException.h"
#include "TZEPFailure.h"

#include <gtest/gtest.h>
#include <stdlib.h>

#include <cstdint>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <functional>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

namespace NQRVZEP20 {

// Expects that the statement throws TZEPException with that status.
#define EXPECT_STATUS(statement, status)                                          \
  EXPECT_THROW(                                                                   \
      {                                                                           \
        try {                                                                     \
          statement;                                                              \
        } catch (::NQRVZEP20::TZEPException const& thrown) {                      \
          EXPECT_STREQ(thrown.what(), ::NQRVZEP20::TZEPException(status).what()); \
          throw;                                                                  \
        }                                                                         \
      },                                                                          \
      ::NQRVZEP20::TZEPException)

// Skips the test, with the reason, when the condition is false; with CI=true it fails instead.
#define NEEDS(condition, reason)                                                        \
  do {                                                                                  \
    if (!(condition)) {                                                                 \
      char const* const ci = ::getenv("CI");                                            \
      if (ci != nullptr && std::string(ci) == "true") FAIL() << "needed: " << (reason); \
      GTEST_SKIP() << (reason);                                                         \
    }                                                                                   \
  } while (false)

// The place of a virtual operation in the virtual table, counted from 1: what a pointer to it holds on this platform.
template <class TMember>
std::size_t SlotOf(TMember member) {
  std::uintptr_t offset = 0;
  std::memcpy(&offset, &member, sizeof offset);
  return (offset - 1) / sizeof(void*) + 1;
}

// A sanitizer makes some calls for itself: vfork among them, which that for threads turns into fork.
#if defined(__has_feature)
constexpr bool kIsSanitized = __has_feature(address_sanitizer) || __has_feature(thread_sanitizer);
#else
constexpr bool kIsSanitized = false;
#endif

// A fresh directory, removed with everything in it at the end.
class TTempDir {
public:
  TTempDir();
  ~TTempDir();
  TTempDir(TTempDir const&) = delete;
  TTempDir& operator=(TTempDir const&) = delete;

  std::string Path() const { return fPath; }
  std::string Path(std::string const& name) const { return fPath + "/" + name; }

private:
  std::string fPath;
};

// Sets or unsets (nullptr) an environment variable, and puts it back at the end.
class TEnvironmentGuard {
public:
  TEnvironmentGuard(char const* name, char const* value);
  ~TEnvironmentGuard();
  TEnvironmentGuard(TEnvironmentGuard const&) = delete;
  TEnvironmentGuard& operator=(TEnvironmentGuard const&) = delete;

private:
  std::string fName, fOld;
  bool fWasSet = false;
};

// A path in the source tree, in the build tree, and in tests/data; the argument is relative to it.
std::string SourcePath(std::string const& relative = "");
std::string BuildPath(std::string const& relative);
std::string TestDataPath(std::string const& relative);

std::string ReadFile(std::string const& path);
void WriteFile(std::string const& path, std::string const& text);

// The reason of the TZEPFailure that the function throws. It fails the test when nothing or something else is thrown.
std::string ReasonOf(std::function<void()> const& function);

// The messages that the in-memory log holds (severities up to Status), oldest first.
std::vector<std::string> LoggedMessages();

// Lets everything through to a log file of the calling thread, and puts the threshold back at the end. Use it on a thread
// of the test's own (OnNewThread) when the test needs the thread's logger untouched before and after.
class TLogCapture {
public:
  TLogCapture();
  ~TLogCapture();
  TLogCapture(TLogCapture const&) = delete;
  TLogCapture& operator=(TLogCapture const&) = delete;

  // The entries written so far, without times: "[Debug] getMachineType() entered.". A message of several lines is one element.
  std::vector<std::string> Entries() const;

private:
  TTempDir fDir;
  ILogger::EZEPLogSeverity fOldThreshold;
};

// Runs the function on a new thread, which has its own logger, and waits for it.
void OnNewThread(std::function<void()> const& function);

}  // namespace NQRVZEP20
