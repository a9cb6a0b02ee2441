// SPDX-License-Identifier: Apache-2.0
#include "os/MediaTexts.h"

#include <algorithm>
#include <charconv>
#include <iterator>

namespace NQRVZEP20 {
namespace {

// Removes the first line from the text and returns it.
std::string_view TakeLine(std::string_view& text) {
  std::size_t const end = text.find('\n');
  std::string_view const line = text.substr(0, end);
  text.remove_prefix(end == text.npos ? text.size() : end + 1);
  return line;
}

bool Holds(std::string_view line, std::string_view part) { return line.find(part) != line.npos; }

// The number after `label` and blanks: 3 in "Dev#=  3".
std::optional<int> NumberAfter(std::string_view line, std::string_view label) {
  std::size_t const at = line.find(label);
  if (at == line.npos) return std::nullopt;
  std::string_view rest = line.substr(at + label.size());
  rest.remove_prefix(std::min(rest.find_first_not_of(' '), rest.size()));
  int number = 0;
  if (std::from_chars(rest.data(), rest.data() + rest.size(), number).ec != std::errc()) return std::nullopt;
  return number;
}

}  // namespace

std::string MountPointOf(std::string const& device) {
  bool const isFloppy = std::find(std::begin(kFloppyDevices), std::end(kFloppyDevices), device) != std::end(kFloppyDevices);
  return isFloppy ? kFloppyMountPoint : kKeyMountPoint;
}

std::string Trimmed(std::string_view text) {
  constexpr char const* blanks = " \t\r";
  std::size_t const first = text.find_first_not_of(blanks);
  if (first == text.npos) return "";
  return std::string(text.substr(first, text.find_last_not_of(blanks) - first + 1));
}

std::vector<std::string> DeviceFilesIn(std::string_view hwinfoOutput, std::string_view header, std::string_view marker) {
  constexpr std::string_view label = "Device File:";
  enum { kNoBlock, kInBlock, kInMarkedBlock } state = kNoBlock;
  std::vector<std::string> files;
  while (!hwinfoOutput.empty()) {
    std::string_view const line = TakeLine(hwinfoOutput);
    if (Holds(line, header)) {
      state = kInBlock;
    } else if (state == kInBlock && Holds(line, marker)) {
      state = kInMarkedBlock;
    } else if (state == kInMarkedBlock && Holds(line, label)) {
      files.push_back(Trimmed(line.substr(line.find(label) + label.size())));
      state = kNoBlock;
    }
  }
  return files;
}

std::string WithoutAlias(std::string const& deviceFile) { return Trimmed(deviceFile.substr(0, deviceFile.find('('))); }

std::optional<TScsiAddress> ScsiAddressFrom(std::string_view text) {
  int numbers[4];
  char const* next = text.data();
  char const* const end = next + text.size();
  for (int& number : numbers) {
    if (&number != numbers && (next == end || *next++ != ':')) return std::nullopt;
    auto const [stop, error] = std::from_chars(next, end, number);
    if (error != std::errc() || number < 0) return std::nullopt;
    next = stop;
  }
  if (next != end) return std::nullopt;
  return TScsiAddress{numbers[0], numbers[1], numbers[2], numbers[3]};
}

bool Lists(std::string_view usbDevices, TUsbDevice const& device) {
  while (!usbDevices.empty()) {
    std::string_view const line = TakeLine(usbDevices);  // "T:  Bus=02 Lev=01 Prnt=01 Port=02 Cnt=01 Dev#=  2 ..."
    if (line.substr(0, 2) != "T:") continue;
    if (NumberAfter(line, "Bus=") == device.fBus && NumberAfter(line, "Dev#=") == device.fDevice) return true;
  }
  return false;
}

}  // namespace NQRVZEP20
