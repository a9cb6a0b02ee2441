// SPDX-License-Identifier: Apache-2.0
#include "MemoryTotals.h"

#include "ExtentRecord.h"

#include <charconv>

namespace NQRVZEP20 {

namespace {

// Removes the first line from the text and returns it.
std::string_view TakeLine(std::string_view& text) {
  std::string_view const line = text.substr(0, text.find('\n'));
  text.remove_prefix(std::min(line.size() + 1, text.size()));
  return line;
}

}  // namespace

TMemInfo TMemInfo::ReadFrom(TMachineFiles const& files, std::string const& file) { return TMemInfo(file, files.Content(file)); }

TMemInfo::TMemInfo(std::string file, TFinding<std::string> const& text) : fFile(std::move(file)) {
  if (!text) {
    fWhyNot = text.Why();
    return;
  }
  for (std::string_view rest = *text; !rest.empty();) {
    std::string_view const line = TakeLine(rest);
    std::size_t const colon = line.find(':');
    if (colon == std::string_view::npos) continue;
    std::string_view const name = line.substr(0, colon);
    std::size_t const digits = line.find_first_of("0123456789", colon);
    std::uint64_t number = 0;
    if (digits == std::string_view::npos ||
        std::from_chars(line.data() + digits, line.data() + line.size(), number).ec != std::errc())
      continue;
    fKilobytes[std::string(name.substr(name.rfind(' ') + 1))] = number;
  }
}

TFinding<std::uint64_t> TMemInfo::Kilobytes(std::string const& name) const {
  if (!fWhyNot.fCode.empty()) return fWhyNot;
  auto const found = fKilobytes.find(name);
  if (found == fKilobytes.end()) return TMissing{kMissingNotGiven, fFile + " contains no " + name};
  return found->second;
}

TFinding<std::uint64_t> TMemInfo::Bytes(std::string const& name) const {
  return Kilobytes(name).Then([](std::uint64_t kilobytes) { return kilobytes << 10; });
}

TRecord MainMemoryRecord(TMemInfo const& info, TSystemName const& name) {
  return ExtentRecord("CIM_Memory", "/proc/meminfo", name, "Main memory", "Main memory", info.Bytes("MemTotal"));
}

}  // namespace NQRVZEP20
