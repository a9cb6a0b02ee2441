#pragma once

// What the tests of every room share.

#include "ILogger.h"
#include "TLogger.h"
#include "TRootObject.h"
#include "TZEPException.h"

#include <gtest/gtest.h>
#include <stdlib.h>

#include <exception>
#include <filesystem>
#include <fstream>
#include <regex>
#include <sstream>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

namespace NQRVZEP20 {

// Expects that the statement throws TZEPException with that status.
#define EXPECT_STATUS(statement, status)                                             \
  EXPECT_THROW(                                                                      \
      {                                                                              \
        try {                                                                        \
          statement;                                                                 \
        } catch (::NQRVZEP20::TZEPException const& thrown) {                         \
          EXPECT_STREQ(thrown.what(), ::NQRVZEP20::TZEPException(status).what());    \
          throw;                                                                     \
        }                                                                            \
      },                                                                             \
      ::NQRVZEP20::TZEPException)

// Skips the test, saying why, when what it needs is not there; with CI=true it fails instead.
#define NEEDS(condition, reason)                                                        \
  do {                                                                                  \
    if (!(condition)) {                                                                 \
      char const* const ci = ::getenv("CI");                                            \
      if (ci != nullptr && std::string(ci) == "true") FAIL() << "needed: " << (reason); \
      GTEST_SKIP() << (reason);                                                         \
    }                                                                                   \
  } while (false)

// A fresh directory, removed with everything in it at the end.
class TTempDir {
public:
  TTempDir() {
    std::string pattern = (std::filesystem::temp_directory_path() / "zep-test.XXXXXX").string();
    if (::mkdtemp(pattern.data()) == nullptr) throw std::runtime_error("no temporary directory");
    fPath = pattern;
  }
  ~TTempDir() {
    std::error_code ignored;
    std::filesystem::remove_all(fPath, ignored);
  }
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
  TEnvironmentGuard(char const* name, char const* value) : fName(name) {
    if (char const* old = ::getenv(name)) fOld = std::string(old), fWasSet = true;
    value ? ::setenv(name, value, 1) : ::unsetenv(name);
  }
  ~TEnvironmentGuard() { fWasSet ? ::setenv(fName.c_str(), fOld.c_str(), 1) : ::unsetenv(fName.c_str()); }
  TEnvironmentGuard(TEnvironmentGuard const&) = delete;
  TEnvironmentGuard& operator=(TEnvironmentGuard const&) = delete;

private:
  std::string fName, fOld;
  bool fWasSet = false;
};

inline std::string ReadFile(std::string const& path) {
  std::ifstream file(path, std::ios::binary);
  std::ostringstream text;
  text << file.rdbuf();
  return text.str();
}

inline void WriteFile(std::string const& path, std::string const& text) { std::ofstream(path, std::ios::binary) << text; }

// The messages that the in-memory log holds (severities up to Status), oldest first.
inline std::vector<std::string> LoggedMessages() {
  std::vector<std::string> messages;
  for (auto const& entry : TRootObject::GetCoreLogger()->GetLog()) messages.push_back(entry.fMessage);
  return messages;
}

// Lets everything through to a log file of the calling thread, and puts the threshold back at the end. Use it on a thread
// of the test's own (OnNewThread) when the test needs the thread's logger untouched before and after.
class TLogCapture {
public:
  TLogCapture() : fOldThreshold(TLogger::GetInstance()->GetLogThreshold()) {
    TLogger::SetLogThreshold(ILogger::kLogVerbose);
    TLogger::GetInstance()->SetLogFilename(fDir.Path("log"));
  }
  ~TLogCapture() { TLogger::SetLogThreshold(fOldThreshold); }
  TLogCapture(TLogCapture const&) = delete;
  TLogCapture& operator=(TLogCapture const&) = delete;

  // What was written so far, without times: "[Debug] getMachineType() entered.". A message of several lines is one element.
  std::vector<std::string> Entries() const {
    std::vector<std::string> entries;
    std::istringstream log(ReadFile(fDir.Path("log")));
    std::string line;
    std::getline(log, line);  // the opening banner
    while (std::getline(log, line)) {
      static std::regex const head("FDR_(\\[[A-Z][a-z]+\\] )\\d+/\\d+/\\d+  \\d+:\\d+:\\d+ ");
      std::smatch match;
      if (std::regex_search(line, match, head, std::regex_constants::match_continuous))
        entries.push_back(match[1].str() + match.suffix().str());
      else if (!entries.empty())
        entries.back() += "\n" + line;
    }
    return entries;
  }

private:
  TTempDir fDir;
  ILogger::EZEPLogSeverity fOldThreshold;
};

// Runs the function on a thread of its own, which has a fresh logger that ends with it.
template <class TFunction>
void OnNewThread(TFunction function) {
  std::thread(function).join();
}

}  // namespace NQRVZEP20
