// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as hwinfo's output, as a SCSI address and as the kernel's list of USB devices.

#include "fuzz/Require.h"
#include "os/MediaTexts.h"

#include <cstdint>

namespace NQRVZEP20 {

namespace {

void ReadAll(std::string_view text) {
  for (std::string const& file : DeviceFilesIn(text, "Hardware Class: disk", "Virtual")) {
    Require(text.find(file) != text.npos && file.find('\n') == file.npos);
    Require(WithoutAlias(file).find('(') == std::string::npos);
  }
  if (auto const address = ScsiAddressFrom(text))
    Require(address->fHost >= 0 && address->fChannel >= 0 && address->fTarget >= 0 && address->fLun >= 0);
  Require(!Lists(text, {-1, -1}) || text.find('-') != text.npos);
}

}  // namespace

}  // namespace NQRVZEP20

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  NQRVZEP20::ReadAll({reinterpret_cast<char const*>(data), size});
  return 0;
}
