// SPDX-License-Identifier: Apache-2.0

// Reads any text as a record of the udev database, and decodes each of its properties.

#include "fuzz/Require.h"
#include "providers/storage/TUdevRecord.h"

#include <algorithm>
#include <sstream>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  NQRVZEP20::TUdevRecord const record = NQRVZEP20::TUdevRecord::From(text);
  Require(record.Exists());
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    std::string const content = line.substr(std::min<std::size_t>(2, line.size())), name = content.substr(0, content.find('='));
    auto const value = record.Value(name), decoded = record.DecodedValue(name);
    if (decoded) Require(value && decoded->size() <= value->size());
    if (value) Require(!value->empty());
  }
  if (record.Links()) Require(!record.Links()->empty());
  return 0;
}
