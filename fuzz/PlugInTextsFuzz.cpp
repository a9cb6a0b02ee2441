// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as the log and as the printed output of a plug-in's process, in pieces of the size that the first byte gives.
// Little is kept of a long text, the beginning and the end of it, and the last line of a log is short.

#include "collect/answer/AnswerLimits.h"
#include "collect/process/LogLines.h"
#include "collect/process/TWords.h"
#include "fuzz/Require.h"

#include <algorithm>
#include <cstdint>
#include <string>

using namespace NQRVZEP20;

namespace {

constexpr std::size_t kMost = 64;

bool BeginsWith(std::string const& text, std::string_view begin) { return text.compare(0, begin.size(), begin) == 0; }

bool EndsWith(std::string const& text, std::string_view end) {
  return text.size() >= end.size() && text.compare(text.size() - end.size(), end.size(), end) == 0;
}

template <class TTake>
void InPieces(std::string_view bytes, std::size_t size, TTake take) {
  for (; !bytes.empty(); bytes.remove_prefix(std::min(size, bytes.size()))) take(bytes.substr(0, size));
}

void ReadWords(std::string_view bytes, std::size_t size) {
  TWords words(kMost), whole(kMost);
  InPieces(bytes, size, [&](std::string_view piece) { words.Add(piece); });
  whole.Add(bytes);
  std::string const kept = words.Get();
  Require(kept == whole.Get());
  Require(bytes.size() > 2 * kMost || kept == bytes);
  Require(kept.size() <= 2 * kMost + 64);
  Require(BeginsWith(kept, bytes.substr(0, kMost)) && EndsWith(kept, bytes.substr(bytes.size() - std::min(bytes.size(), kMost))));
}

void ReadLog(std::string_view bytes, std::size_t size) {
  std::string log;
  InPieces(bytes, size, [&](std::string_view piece) {
    AddToLog(log, piece, kMost);
    Require(log.size() <= kMost + kMost / 2);
  });
  Require(BeginsWith(log, bytes.substr(0, kMost / 2)));
  Require(EndsWith(log, bytes.substr(bytes.size() - std::min(bytes.size(), kMost / 2))));
}

void ReadLines(std::string const& log) {
  std::size_t length = 0;
  for (TLogLine const& line : LogLinesOf(log)) {
    Require(line.fSeverity >= ILogger::kLogError && line.fSeverity <= ILogger::kLogVerbose);
    length += line.fMessage.size();
  }
  Require(length <= log.size());
  std::string const last = LastLogLineOf(log);
  Require(last.size() <= kLongestFailure && last.find('\n') == last.npos);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  if (size == 0) return 0;
  std::string_view const bytes(reinterpret_cast<char const*>(data) + 1, size - 1);
  std::size_t const pieceSize = data[0] % kMost + 1;
  ReadWords(bytes, pieceSize);
  ReadLog(bytes, pieceSize);
  ReadLines(std::string(bytes));
  return 0;
}
