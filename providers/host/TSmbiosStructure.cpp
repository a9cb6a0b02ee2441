// SPDX-License-Identifier: Apache-2.0
#include "TSmbiosStructure.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

template <class T>
T As(std::uint64_t number) {
  return static_cast<T>(number);
}

std::uint64_t LittleEndian(std::vector<unsigned char> const& bytes) {
  std::uint64_t number = 0;
  for (std::size_t at = bytes.size(); at-- > 0;) number = number << 8 | bytes[at];
  return number;
}

constexpr std::size_t kHeaderSize = 4;
constexpr std::size_t kLengthOffset = 1;  // the byte with the size of the header and the formatted area

}  // namespace

TSmbiosStructure::TSmbiosStructure(std::vector<unsigned char> bytes) : fBytes(std::move(bytes)) {}

TSmbiosStructure::TSmbiosStructure(TMissing why) : fWhyAbsent(std::move(why)) {}

TFinding<std::uint8_t> TSmbiosStructure::Byte(std::size_t offset) const {
  return Bytes(offset, 1).Then(LittleEndian).Then(As<std::uint8_t>);
}

TFinding<std::uint16_t> TSmbiosStructure::Word(std::size_t offset) const {
  return Bytes(offset, 2).Then(LittleEndian).Then(As<std::uint16_t>);
}

TFinding<std::uint32_t> TSmbiosStructure::DWord(std::size_t offset) const {
  return Bytes(offset, 4).Then(LittleEndian).Then(As<std::uint32_t>);
}

TFinding<std::uint64_t> TSmbiosStructure::QWord(std::size_t offset) const { return Bytes(offset, 8).Then(LittleEndian); }

TFinding<std::vector<unsigned char>> TSmbiosStructure::Bytes(std::size_t offset, std::size_t count) const {
  if (!fWhyAbsent.fCode.empty()) return fWhyAbsent;
  if (offset + count > FormattedSize()) return TMissing{kMissingNotGiven, "the firmware's structure ends before this field"};
  return std::vector<unsigned char>(fBytes.begin() + offset, fBytes.begin() + offset + count);
}

TFinding<std::string> TSmbiosStructure::Text(std::size_t offset) const {
  return Byte(offset).Then([this](std::uint8_t number) { return StringAt(number); });
}

TFinding<std::string> TSmbiosStructure::StringAt(std::uint8_t number) const {
  if (number == 0) return TMissing{kMissingNotGiven, "not given by the firmware"};

  auto const texts = Texts();
  if (number <= texts.size()) return texts[number - 1];
  return TMissing{kMissingUnexpected,
                  "the firmware refers to string " + std::to_string(number) + ", which the structure does not contain"};
}

std::vector<std::string> TSmbiosStructure::Texts() const {
  std::vector<std::string> texts;
  auto text = fBytes.begin() + FormattedSize();
  while (text != fBytes.end() && *text != 0) {
    auto const end = std::find(text, fBytes.end(), 0);
    if (end == fBytes.end()) break;
    texts.emplace_back(text, end);
    text = end + 1;
  }
  return texts;
}

std::size_t TSmbiosStructure::FormattedSize() const {
  if (fBytes.size() < kHeaderSize) return 0;
  return std::min<std::size_t>(fBytes[kLengthOffset], fBytes.size());
}

}  // namespace NQRVZEP20
