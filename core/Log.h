// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ILogger.h"

#include <string>
#include <string_view>
#include <type_traits>

namespace NQRVZEP20 {

// The functions through which every room logs. Each takes the pieces of a message, compares the severity with the threshold,
// and only then builds the text, so that a filtered call allocates nothing. Without a logger they do nothing.
//
//   LogDebug("TConfig::getValue(): key ", key, " found, value is ", value);

// Whether the calling thread's logger would accept an entry of that severity: the severity is not above the threshold or is
// one of the memory-only ones.
bool IsLogged(ILogger::EZEPLogSeverity severity);

void WriteLogEntry(ILogger::EZEPLogSeverity severity, std::string const& message);

inline void AppendPiece(std::string& message, std::string_view piece) { message.append(piece); }

// Numbers, in decimal.
template <class T>
std::enable_if_t<std::is_integral_v<T>> AppendPiece(std::string& message, T number) {
  message.append(std::to_string(number));
}

template <class... TPieces>
void Log(ILogger::EZEPLogSeverity severity, TPieces const&... pieces) {
  if (!IsLogged(severity)) return;
  std::string message;
  (AppendPiece(message, pieces), ...);
  WriteLogEntry(severity, message);
}

template <class... TPieces>
void LogError(TPieces const&... pieces) {
  Log(ILogger::kLogError, pieces...);
}

template <class... TPieces>
void LogStatus(TPieces const&... pieces) {
  Log(ILogger::kLogStatus, pieces...);
}

template <class... TPieces>
void LogDebug(TPieces const&... pieces) {
  Log(ILogger::kLogDebug, pieces...);
}

}  // namespace NQRVZEP20
