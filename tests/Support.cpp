// SPDX-License-Identifier: Apache-2.0
#include "tests/Support.h"

#include "TLogger.h"
#include "TRootObject.h"

#include <sys/stat.h>

#include <cctype>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string_view>
#include <thread>

namespace NQRVZEP20 {

namespace {

// Makes the tests independent of the caller's settings: other users can read files that tests create, tools print English, and
// the variable no_proxy has no effect.
[[maybe_unused]] mode_t const gCallersUmask = ::umask(022);
[[maybe_unused]] bool const gIsPlain =
    ::setenv("LC_ALL", "C", 1) == 0 && ::unsetenv("no_proxy") == 0 && ::unsetenv("NO_PROXY") == 0;

}  // namespace

TTempDir::TTempDir() {
  namespace fs = std::filesystem;
  std::string pattern = (fs::canonical(fs::temp_directory_path()) / "zep-test.XXXXXX").string();
  if (::mkdtemp(pattern.data()) == nullptr) throw std::runtime_error("no temporary directory");
  fPath = pattern;
}

TTempDir::~TTempDir() {
  std::error_code ignored;
  std::filesystem::remove_all(fPath, ignored);
}

TEnvironmentGuard::TEnvironmentGuard(char const* name, char const* value) : fName(name) {
  if (char const* const old = ::getenv(name)) {
    fOld = old;
    fWasSet = true;
  }
  value ? ::setenv(name, value, 1) : ::unsetenv(name);
}

TEnvironmentGuard::~TEnvironmentGuard() { fWasSet ? ::setenv(fName.c_str(), fOld.c_str(), 1) : ::unsetenv(fName.c_str()); }

std::string SourcePath(std::string const& relative) { return relative.empty() ? ZEP_SOURCE_DIR : ZEP_SOURCE_DIR "/" + relative; }

std::string BuildPath(std::string const& relative) { return ZEP_BUILD_DIR "/" + relative; }

std::string TestDataPath(std::string const& relative) { return SourcePath("tests/data/" + relative); }

std::string ReadFile(std::string const& path) {
  std::ifstream file(path, std::ios::binary);
  std::ostringstream text;
  text << file.rdbuf();
  return text.str();
}

void WriteFile(std::string const& path, std::string const& text) { std::ofstream(path, std::ios::binary) << text; }

std::string ReasonOf(std::function<void()> const& function) {
  try {
    function();
  } catch (TZEPFailure const& failure) {
    return failure.Reason();
  } catch (TZEPException const& failure) {
    ADD_FAILURE() << failure.what() << " has no reason";
    return "";
  }
  ADD_FAILURE() << "nothing was thrown";
  return "";
}

std::vector<std::string> LoggedMessages() {
  std::vector<std::string> messages;
  for (auto const& entry : TRootObject::GetCoreLogger()->GetLog()) messages.push_back(entry.fMessage);
  return messages;
}

TLogCapture::TLogCapture() : fOldThreshold(TLogger::GetInstance()->GetLogThreshold()) {
  TLogger::SetLogThreshold(ILogger::kLogVerbose);
  TLogger::GetInstance()->SetLogFilename(fDir.Path("log"));
}

TLogCapture::~TLogCapture() { TLogger::SetLogThreshold(fOldThreshold); }

namespace {

// The number of characters at the start of `text` that are digits or in `others`.
std::size_t LengthOf(std::string_view text, std::string_view others) {
  std::size_t length = 0;
  while (length < text.size() &&
         (std::isdigit(static_cast<unsigned char>(text[length])) || others.find(text[length]) != others.npos))
    ++length;
  return length;
}

// "FDR_[Debug] 3/3/2024  9:5:7 message" becomes "[Debug] message"; empty for a line that does not begin an entry.
std::string WithoutTime(std::string_view line) {
  constexpr std::string_view kPrefix = "FDR_";
  std::size_t const labelEnd = line.find("] ");
  if (line.substr(0, kPrefix.size()) != kPrefix || labelEnd == line.npos) return "";
  std::string const label(line.substr(kPrefix.size(), labelEnd + 2 - kPrefix.size()));
  line.remove_prefix(labelEnd + 2);
  line.remove_prefix(LengthOf(line, "/"));
  if (line.substr(0, 2) != "  ") return "";
  line.remove_prefix(2);
  line.remove_prefix(LengthOf(line, ":"));
  if (line.substr(0, 1) != " ") return "";
  return label + std::string(line.substr(1));
}

}  // namespace

std::vector<std::string> TLogCapture::Entries() const {
  std::vector<std::string> entries;
  std::istringstream log(ReadFile(fDir.Path("log")));
  std::string line;
  std::getline(log, line);  // the opening banner
  while (std::getline(log, line)) {
    std::string const entry = WithoutTime(line);
    if (!entry.empty())
      entries.push_back(entry);
    else if (!entries.empty())
      entries.back() += "\n" + line;
  }
  return entries;
}

void OnNewThread(std::function<void()> const& function) { std::thread(function).join(); }

}  // namespace NQRVZEP20
