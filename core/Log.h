#pragma once

#include "ILogger.h"

#include <string>
#include <string_view>
#include <type_traits>

namespace NQRVZEP20 {

// The log door: how every room logs. It takes the pieces of a message, asks the threshold first, and only then builds the
// text, so that a filtered call costs no allocation. Without a logger it is silent.
//
//   LogDebug("TConfig::getValue(): key ", key, " found, value is ", value);

// Whether an entry of that severity would get past the threshold of the calling thread's logger; the memory-only ones always
// do.
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
