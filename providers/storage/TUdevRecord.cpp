// SPDX-License-Identifier: Apache-2.0
#include "TUdevRecord.h"

#include <algorithm>
#include <charconv>
#include <sstream>

namespace NQRVZEP20 {

namespace {

std::string WithoutOuterBlanks(std::string const& text) {
  auto const first = text.find_first_not_of(" \t");
  return first == text.npos ? "" : text.substr(first, text.find_last_not_of(" \t") - first + 1);
}

// Replaces each "\xHH" by the byte with that hexadecimal code.
std::string Decoded(std::string const& text) {
  std::string decoded;
  for (std::size_t i = 0; i < text.size(); ++i) {
    unsigned char byte = 0;
    bool const isEscape = text.compare(i, 2, "\\x") == 0 && i + 4 <= text.size() &&
                          std::from_chars(&text[i] + 2, &text[i] + 4, byte, 16).ptr == &text[i] + 4;
    decoded += isEscape ? static_cast<char>(byte) : text[i];
    if (isEscape) i += 3;
  }
  return decoded;
}

}  // namespace

TUdevRecord TUdevRecord::From(std::string const& text) {
  TUdevRecord record{TMissing()};
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    std::string const content = line.substr(std::min<std::size_t>(2, line.size()));
    std::size_t const equals = content.find('=');
    if (line.rfind("E:", 0) == 0 && equals != content.npos)
      record.fValues[content.substr(0, equals)] = content.substr(equals + 1);
    if (line.rfind("S:", 0) == 0 && !content.empty()) record.fLinks.push_back("/dev/" + content);
  }
  std::sort(record.fLinks.begin(), record.fLinks.end());
  return record;
}

TUdevRecord TUdevRecord::FromBlkid(std::string const& text) {
  if (text.empty())
    return TUdevRecord(TMissing{kMissingNotGiven, "without udev: blkid found nothing on this device, or could not read it"});
  std::istringstream lines(text);
  std::string properties;
  for (std::string line; std::getline(lines, line);) properties += "E:" + line + "\n";
  TUdevRecord record = From(properties);
  record.fOrigin = "the output of blkid";
  return record;
}

TUdevRecord TUdevRecord::Of(TMachineFiles const& files, TFinding<std::string> const& number) {
  if (!number) return TUdevRecord(number.Why());
  auto const text = files.Content("/run/udev/data/b" + *number);
  return text ? From(*text) : TUdevRecord(text.Why());
}

TFinding<std::string> TUdevRecord::Value(std::string const& name) const {
  if (!Exists()) return fWhy;
  auto const found = fValues.find(name);
  std::string const value = found == fValues.end() ? "" : WithoutOuterBlanks(found->second);
  if (value.empty()) return TMissing{kMissingNotGiven, fOrigin + " has no " + name + " of this device"};
  return value;
}

TFinding<std::string> TUdevRecord::DecodedValue(std::string const& name) const {
  return Value(name).Then([&](std::string const& value) -> TFinding<std::string> {
    std::string const decoded = WithoutOuterBlanks(Decoded(value));
    if (decoded.empty()) return TMissing{kMissingNotGiven, fOrigin + " has only blanks as " + name + " of this device"};
    return decoded;
  });
}

TFinding<std::vector<std::string>> TUdevRecord::Links() const {
  if (!Exists()) return fWhy;
  if (fLinks.empty()) return TMissing{kMissingNotGiven, "no links to the node are known"};
  return fLinks;
}

}  // namespace NQRVZEP20
