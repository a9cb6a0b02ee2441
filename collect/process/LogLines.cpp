// SPDX-License-Identifier: Apache-2.0
#include "collect/process/LogLines.h"

#include "collect/SafeText.h"
#include "collect/answer/AnswerLimits.h"

#include <algorithm>
#include <optional>
#include <regex>
#include <sstream>

namespace NQRVZEP20 {

namespace {

constexpr char const* kLabels[] = {"Error", "Warning", "Status", "Debug", "Verbose"};  // by severity

constexpr std::size_t kEnd = 64 * 1024;  // searched for the last entry

// The entry that the line begins; none if it continues one. The expression is compiled at the first entry: that takes longer than
// reading many lines, and most logs have no entry.
std::optional<TLogLine> EntryIn(std::string const& line) {
  if (line.rfind("FDR_[", 0) != 0) return std::nullopt;
  static std::regex const entry(R"(FDR_\[(Error|Warning|Status|Debug|Verbose)\] \d+/\d+/\d+  \d+:\d+:\d+ )");
  std::string const head = line.substr(0, 48);  // longer than the head of any entry
  std::smatch match;
  if (!std::regex_search(head, match, entry, std::regex_constants::match_continuous)) return std::nullopt;
  int severity = 0;
  while (kLabels[severity] != match[1]) ++severity;
  return TLogLine{static_cast<ILogger::EZEPLogSeverity>(severity), line.substr(static_cast<std::size_t>(match.length()))};
}

}  // namespace

std::vector<TLogLine> LogLinesOf(std::string const& text) {
  std::vector<TLogLine> lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) {
    if (line.rfind("-- ZEP Log ", 0) == 0) continue;
    if (auto const entry = EntryIn(line))
      lines.push_back(*entry);
    else if (!lines.empty())
      lines.back().fMessage += "\n" + line;
  }
  return lines;
}

// The middle is removed rarely, because that moves the end.
void AddToLog(std::string& log, std::string_view text, std::size_t most) {
  log.append(text);
  if (log.size() > most + most / 2) log.erase(most / 2, log.size() - most);
}

std::string LastLogLineOf(std::string const& text) {
  std::vector<TLogLine> const lines = LogLinesOf(text.substr(text.size() - std::min(text.size(), kEnd)));
  if (lines.empty()) return "";
  std::string const& message = lines.back().fMessage;
  std::string const line = "[" + std::string(kLabels[lines.back().fSeverity]) + "] " + message.substr(0, message.find('\n'));
  return Shortened(line, kLongestFailure);
}

}  // namespace NQRVZEP20
