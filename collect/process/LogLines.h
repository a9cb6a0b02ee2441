// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ILogger.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// One entry of a log file.
struct TLogLine {
  ILogger::EZEPLogSeverity fSeverity;
  std::string fMessage;
};

// The entries of the text of a log file (docs/formats.md), without banners. A line that does not begin like an entry belongs to
// the message before it.
std::vector<TLogLine> LogLinesOf(std::string const& text);

// "[Error] no disk", the first line of the message only; empty for no entry.
std::string LastLogLineOf(std::string const& text);

}  // namespace NQRVZEP20
