// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TByteReader.h"

#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TBadAnswer.h"

#include <algorithm>
#include <string>

namespace NQRVZEP20 {

namespace {

std::uint64_t Limited(std::uint64_t value, std::uint64_t most, char const* what) {
  if (value > most) throw TBadAnswer(std::string(what) + ": " + std::to_string(value) + ", more than " + std::to_string(most));
  return value;
}

}  // namespace

TByteReader::TByteReader(std::string_view bytes, std::size_t at) : fBytes(bytes), fAt(at) {
  if (at > bytes.size()) throw TBadAnswer("a position is after the end");
}

unsigned char TByteReader::Byte() {
  Require(1);
  return static_cast<unsigned char>(fBytes[fAt++]);
}

std::uint64_t TByteReader::Number() {
  std::uint64_t value = 0;
  for (unsigned shift = 0; shift < 64; shift += 7) {
    unsigned char const byte = Byte();
    value |= static_cast<std::uint64_t>(byte & 0x7f) << shift;
    if ((byte & 0x80) == 0) return value;
  }
  throw TBadAnswer("a number has too many bytes");
}

std::uint64_t TByteReader::NumberUpTo(std::uint64_t most, char const* what) { return Limited(Number(), most, what); }

std::size_t TByteReader::Count(std::uint64_t most, char const* what) {
  std::uint64_t const count = Number();
  return static_cast<std::size_t>(Limited(count, std::min<std::uint64_t>(most, Left()), what));
}

std::string_view TByteReader::Text() {
  std::uint64_t const length = Number();
  if (length > Left()) throw TBadAnswer("a string is longer than the remaining bytes");
  std::string_view const text = fBytes.substr(fAt, static_cast<std::size_t>(length));
  fAt += text.size();
  return text;
}

std::string_view TByteReader::Name() {
  std::string_view const name = Text();
  if (name.size() > kLongestName) throw TBadAnswer("a name has more than " + std::to_string(kLongestName) + " bytes");
  return name;
}

void TByteReader::Skip(std::size_t bytes) {
  Require(bytes);
  fAt += bytes;
}

void TByteReader::Require(std::size_t bytes) const {
  if (bytes > Left()) throw TBadAnswer("the bytes end too early");
}

}  // namespace NQRVZEP20
