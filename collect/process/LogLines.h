// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ILogger.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// One entry of a log file.
struct TLogLine {
  ILogger::EZEPLogSeverity fSeverity;
  std::string fMessage;
};

// Parses the text of a log file (docs/formats.md) into its entries, without banners. A line that does not begin like an entry
// is a continuation of the previous message.
std::vector<TLogLine> LogLinesOf(std::string const& text);

// Appends the text to a log file's. Of a long text about `most` bytes are kept, half of them at each end.
void AddToLog(std::string& log, std::string_view text, std::size_t most);

// The last entry, with only the first line of its message: "[Error] no disk". A long line is cut (AnswerLimits.h). Empty if there
// is no entry in the last 64 KiB.
std::string LastLogLineOf(std::string const& text);

}  // namespace NQRVZEP20
