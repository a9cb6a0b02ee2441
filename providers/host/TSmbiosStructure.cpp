// SPDX-License-Identifier: Apache-2.0
#include "TSmbiosStructure.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kHeaderSize = 4;
constexpr std::size_t kLengthOffset = 1;  // of the byte that holds the size of header and formatted area

}  // namespace

TSmbiosStructure::TSmbiosStructure(std::vector<unsigned char> bytes) : fBytes(std::move(bytes)) {}

TSmbiosStructure::TSmbiosStructure(TMissing why) : fWhyAbsent(std::move(why)) {}

TFinding<std::uint8_t> TSmbiosStructure::Byte(std::size_t offset) const {
  auto const number = Number(offset, 1);
  if (!number) return number.Why();
  return static_cast<std::uint8_t>(*number);
}

TFinding<std::uint16_t> TSmbiosStructure::Word(std::size_t offset) const {
  auto const number = Number(offset, 2);
  if (!number) return number.Why();
  return static_cast<std::uint16_t>(*number);
}

TFinding<std::uint32_t> TSmbiosStructure::DWord(std::size_t offset) const {
  auto const number = Number(offset, 4);
  if (!number) return number.Why();
  return static_cast<std::uint32_t>(*number);
}

TFinding<std::vector<unsigned char>> TSmbiosStructure::Bytes(std::size_t offset, std::size_t count) const {
  if (!fWhyAbsent.fCode.empty()) return fWhyAbsent;
  if (offset + count > FormattedSize()) return TMissing{kMissingNotGiven, "the firmware's structure ends before this field"};
  return std::vector<unsigned char>(fBytes.begin() + offset, fBytes.begin() + offset + count);
}

TFinding<std::string> TSmbiosStructure::Text(std::size_t offset) const {
  auto const number = Byte(offset);
  if (!number) return number.Why();
  if (*number == 0) return TMissing{kMissingNotGiven, "the firmware gives no text"};

  auto text = fBytes.begin() + FormattedSize();
  for (int at = 1; text != fBytes.end() && *text != 0; ++at) {
    auto const end = std::find(text, fBytes.end(), 0);
    if (end == fBytes.end()) break;
    if (at == *number) return std::string(text, end);
    text = end + 1;
  }
  return TMissing{kMissingUnexpected,
                  "the firmware names text " + std::to_string(*number) + ", which its structure does not hold"};
}

TFinding<std::uint64_t> TSmbiosStructure::Number(std::size_t offset, std::size_t size) const {
  auto const bytes = Bytes(offset, size);
  if (!bytes) return bytes.Why();
  std::uint64_t number = 0;
  for (std::size_t at = size; at-- > 0;) number = number << 8 | (*bytes)[at];
  return number;
}

std::size_t TSmbiosStructure::FormattedSize() const {
  if (fBytes.size() < kHeaderSize) return 0;
  return std::min<std::size_t>(fBytes[kLengthOffset], fBytes.size());
}

}  // namespace NQRVZEP20
