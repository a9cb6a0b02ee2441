// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as a list of PCI identifiers, after the numbers that are looked up in it. Each name must be part of a line.

#include "fuzz/Require.h"
#include "providers/devices/TPciIdList.h"

#include <cstring>

namespace {

using namespace NQRVZEP20;

void RequireInLine(std::string_view text, std::string const& name) {
  Require(name.find('\n') == name.npos && text.find(name) != text.npos);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  TPciNumbers numbers{};
  if (size < sizeof numbers) return 0;
  std::memcpy(&numbers, data, sizeof numbers);
  std::string_view const text(reinterpret_cast<char const*>(data) + sizeof numbers, size - sizeof numbers);
  TPciIdList const list(text);
  RequireInLine(text, list.VendorOf(numbers));
  RequireInLine(text, list.DeviceOf(numbers));
  RequireInLine(text, list.SubsystemOf(numbers));
  std::string const cls = list.ClassOf(numbers);
  RequireInLine(text, cls.substr(0, cls.rfind(" [")));
  return 0;
}
