// SPDX-License-Identifier: Apache-2.0
#include "TPciIdList.h"

#include <algorithm>
#include <cstdio>

namespace NQRVZEP20 {

namespace {

using TBlocks = std::vector<std::string_view>;

// A line of the list, without its key, and the lines below it.
struct TEntry {
  std::string_view fName;
  std::string_view fBelow;  // begins with a line end
};

bool BeginsBlock(char c) { return c != '\t' && c != '#' && c != '\n' && c != '\r'; }

TBlocks BlocksOf(std::string_view text) {
  TBlocks blocks;
  std::size_t begin = text.size();
  for (std::size_t at = 0; at < text.size(); at = std::min(text.find('\n', at), text.size() - 1) + 1) {
    if (!BeginsBlock(text[at])) continue;
    if (begin < at) blocks.push_back(text.substr(begin, at - begin));
    begin = at;
  }
  if (begin < text.size()) blocks.push_back(text.substr(begin));
  return blocks;
}

std::string_view WithoutOuterBlanks(std::string_view text) {
  constexpr char const* blanks = " \t\r";
  std::size_t const first = text.find_first_not_of(blanks);
  return first == text.npos ? std::string_view() : text.substr(first, text.find_last_not_of(blanks) + 1 - first);
}

TEntry EntryFrom(std::string_view block, std::string const& key) {
  std::size_t const end = std::min(block.find('\n', key.size()), block.size());
  return {WithoutOuterBlanks(block.substr(key.size(), end - key.size())), block.substr(end)};
}

TEntry TopEntry(TBlocks const& blocks, std::string const& key) {
  auto const hasKey = [&](std::string_view block) { return block.substr(0, key.size()) == key; };
  auto const block = std::find_if(blocks.begin(), blocks.end(), hasKey);
  return block != blocks.end() ? EntryFrom(*block, key) : TEntry();
}

// `indentation` is the line end and the tabs before the key. A line with more tabs is below the entry.
TEntry EntryBelow(TEntry const& above, std::string const& indentation, std::string const& key) {
  std::string_view lines = above.fBelow;
  std::size_t const begin = lines.find(indentation + key);
  if (begin == lines.npos) return {};
  std::size_t end = lines.find(indentation, begin + 1);
  while (end != lines.npos && lines.substr(end + indentation.size(), 1) == "\t") end = lines.find(indentation, end + 1);
  return EntryFrom(lines.substr(begin, end - begin), indentation + key);
}

std::string HexadecimalDigits(unsigned number) {
  char text[9];
  std::snprintf(text, sizeof text, "%04x", number);
  return text;
}

TEntry VendorIn(TBlocks const& blocks, TPciNumbers const& numbers) {
  return TopEntry(blocks, HexadecimalDigits(numbers.fVendor) + " ");
}

TEntry DeviceIn(TBlocks const& blocks, TPciNumbers const& numbers) {
  return EntryBelow(VendorIn(blocks, numbers), "\n\t", HexadecimalDigits(numbers.fDevice) + " ");
}

}  // namespace

TPciIdList::TPciIdList(std::string_view text) : fBlocks(BlocksOf(text)) {}

std::string TPciIdList::VendorOf(TPciNumbers const& numbers) const { return std::string(VendorIn(fBlocks, numbers).fName); }

std::string TPciIdList::DeviceOf(TPciNumbers const& numbers) const { return std::string(DeviceIn(fBlocks, numbers).fName); }

std::string TPciIdList::SubsystemOf(TPciNumbers const& numbers) const {
  std::string const key = HexadecimalDigits(numbers.fSubsystemVendor) + " " + HexadecimalDigits(numbers.fSubsystem) + " ";
  TEntry const device = DeviceIn(fBlocks, numbers), subsystem = EntryBelow(device, "\n\t\t", key);
  bool const isDevice = numbers.fSubsystemVendor == numbers.fVendor && numbers.fSubsystem == numbers.fDevice;
  return std::string(subsystem.fName.empty() && isDevice ? device.fName : subsystem.fName);
}

std::string TPciIdList::ClassOf(TPciNumbers const& numbers) const {
  std::string const digits = HexadecimalDigits((numbers.fClass >> 8) & 0xffff);
  TEntry const cls = TopEntry(fBlocks, "C " + digits.substr(0, 2) + " ");
  TEntry const subclass = EntryBelow(cls, "\n\t", digits.substr(2) + " ");
  if (cls.fName.empty() || !subclass.fName.empty()) return std::string(subclass.fName);
  return std::string(cls.fName) + " [" + digits + "]";
}

}  // namespace NQRVZEP20
