// SPDX-License-Identifier: Apache-2.0
#include "VpdPages.h"

#include <algorithm>
#include <cstdint>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kHeader = 4;
constexpr unsigned kNotRotating = 1;  // a rotation rate; 0 means "not reported"
constexpr unsigned kLowestRotation = 0x401;
constexpr unsigned kHighestRotation = 0xfffe;
constexpr unsigned kLastFormFactor = 5;

constexpr std::size_t kIdentifyData = 60;  // the offset in page 89
constexpr std::size_t kIdentifyBytes = 512;

unsigned ByteAt(std::string_view bytes, std::size_t offset) {
  return offset < bytes.size() ? static_cast<std::uint8_t>(bytes[offset]) : 0;
}

unsigned BigEndian16(std::string_view bytes, std::size_t offset) {
  return ByteAt(bytes, offset) << 8 | ByteAt(bytes, offset + 1);
}

// The content of a page, as long as the header states and at most as long as the bytes are.
std::string_view ContentOf(std::string_view page, unsigned code) {
  if (page.size() < kHeader || ByteAt(page, 1) != code) return {};
  return page.substr(kHeader, BigEndian16(page, 2));
}

TFinding<std::string> TextFrom(std::string_view bytes, char const* what) {
  auto const isBlank = [](char c) { return c == ' ' || c == '\0'; };
  while (!bytes.empty() && isBlank(bytes.front())) bytes.remove_prefix(1);
  while (!bytes.empty() && isBlank(bytes.back())) bytes.remove_suffix(1);
  if (bytes.empty()) return TMissing{kMissingNotGiven, std::string("the disk reports no ") + what};
  return std::string(bytes);
}

std::string HexFrom(std::string_view bytes) {
  constexpr char kDigits[] = "0123456789abcdef";
  std::string text;
  for (char const c : bytes) {
    text += kDigits[static_cast<std::uint8_t>(c) >> 4];
    text += kDigits[static_cast<std::uint8_t>(c) & 15];
  }
  return text;
}

TFinding<unsigned> RotationFrom(unsigned code) {
  if (code == kNotRotating) return 0U;
  if (code >= kLowestRotation && code <= kHighestRotation) return code;
  return TMissing{kMissingNotGiven, "the disk reports no rotation rate"};
}

TFinding<unsigned> FormFactorFrom(unsigned code) {
  if (code >= 1 && code <= kLastFormFactor) return code;
  return TMissing{kMissingNotGiven, "the disk reports no form factor"};
}

// Adds the designator of a logical unit; designators of ports and targets, and formats that are not unique, are omitted.
void AddDesignator(unsigned codeSet, unsigned associationAndType, std::string_view value, std::vector<TDesignator>& designators) {
  constexpr unsigned kAscii = 2;
  unsigned const association = associationAndType >> 4 & 3, type = associationAndType & 15;
  if (association != 0 || value.empty()) return;
  if (type == 1 && (codeSet & 15) == kAscii) {
    auto const text = TextFrom(value, "vendor ID");
    if (text) designators.push_back({"T10 vendor ID", *text});
  }
  if (type == 2) designators.push_back({"EUI64", HexFrom(value)});
  if (type == 3) designators.push_back({"NAA", HexFrom(value)});
  if (type == 10 && value.size() > 2) designators.push_back({"UUID", HexFrom(value.substr(2))});
}

// A text of the ATA data, in which the two bytes of each word are swapped.
TFinding<std::string> AtaText(std::string_view data, std::size_t firstWord, std::size_t words, char const* what) {
  std::string text(data.substr(2 * firstWord, 2 * words));
  for (std::size_t i = 0; i + 1 < text.size(); i += 2) std::swap(text[i], text[i + 1]);
  return TextFrom(text, what);
}

unsigned AtaWord(std::string_view data, std::size_t word) { return ByteAt(data, 2 * word) | ByteAt(data, 2 * word + 1) << 8; }

}  // namespace

TFinding<std::string> SerialNumberFrom(std::string_view page80) { return TextFrom(ContentOf(page80, 0x80), "serial number"); }

std::vector<TDesignator> DesignatorsFrom(std::string_view page83) {
  std::vector<TDesignator> designators;
  std::string_view rest = ContentOf(page83, 0x83);
  while (rest.size() > kHeader) {
    std::string_view const value = rest.substr(kHeader, ByteAt(rest, 3));
    AddDesignator(ByteAt(rest, 0), ByteAt(rest, 1), value, designators);
    rest.remove_prefix(kHeader + value.size());
  }
  return designators;
}

TCharacteristics CharacteristicsFrom(std::string_view pageB1) {
  std::string_view const content = ContentOf(pageB1, 0xb1);
  return {RotationFrom(BigEndian16(content, 0)), FormFactorFrom(ByteAt(content, 3) & 15)};
}

TAtaIdentity AtaIdentityFrom(std::string_view page89) {
  std::string_view const page = ContentOf(page89, 0x89);
  std::string_view const data = page.size() < kIdentifyData - kHeader + kIdentifyBytes
                                    ? std::string_view()
                                    : page.substr(kIdentifyData - kHeader, kIdentifyBytes);
  if (data.empty()) {
    TMissing const why{kMissingNotGiven, "the disk has no page of ATA information"};
    return {why, why, why, why, why};
  }
  return {AtaText(data, 10, 10, "serial number"), AtaText(data, 23, 4, "firmware version"), AtaText(data, 27, 20, "model"),
          RotationFrom(AtaWord(data, 217)), FormFactorFrom(AtaWord(data, 168) & 15)};
}

}  // namespace NQRVZEP20
