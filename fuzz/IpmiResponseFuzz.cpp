// SPDX-License-Identifier: Apache-2.0

// Checks any bytes as a response packet of a management controller, in every mode. No byte outside the packet's buffer may
// be read, and the result must be that of an independent check written here.

#include "IIPMILan.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <vector>

using NQRVZEP20::IIPMILan;

namespace {

// Resizes the packet so that its buffer has exactly the bytes that IIPMILan::ChkResponse requires: after the length byte as
// many as it says, and at least 7.
void FitArea(std::vector<char>& packet, std::ptrdiff_t lengthPlace) {
  constexpr std::ptrdiff_t kLeast = 7;
  std::ptrdiff_t const place = std::max<std::ptrdiff_t>(lengthPlace, 0);
  packet.resize(std::max(packet.size(), static_cast<std::size_t>(place + 1)));
  std::ptrdiff_t const length = lengthPlace < 0 ? 0 : static_cast<signed char>(packet[static_cast<std::size_t>(place)]);
  packet.resize(static_cast<std::size_t>(place + 1 + std::max(length, kLeast)));
  packet.shrink_to_fit();
}

unsigned ByteAt(std::vector<char> const& packet, std::ptrdiff_t place) {
  return static_cast<unsigned char>(packet.at(static_cast<std::size_t>(place)));
}

bool IsChecksumRight(std::vector<char> const& packet, std::ptrdiff_t lengthPlace) {
  if (lengthPlace < 0) return false;
  std::ptrdiff_t const last = lengthPlace + static_cast<signed char>(ByteAt(packet, lengthPlace));
  unsigned sum = 0;
  for (std::ptrdiff_t place = lengthPlace + 1; place < last; ++place) sum += ByteAt(packet, place);
  return last >= 0 && ((sum + ByteAt(packet, last)) & 0xFF) == 0;
}

bool IsCompleted(std::vector<char> const& packet, std::ptrdiff_t lengthPlace) {
  return lengthPlace + 7 >= 0 && ByteAt(packet, lengthPlace + 7) == 0;
}

void ExpectSame(bool checked, bool expected) {
  if (checked != expected) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  if (size < 6) return 0;
  // The first byte of the input is the length position, the rest is the packet.
  int const lengthPosition = static_cast<signed char>(data[0]);  // NOLINT(bugprone-signed-char-misuse): may be negative
  std::vector<char> packet(data + 1, data + size);
  std::ptrdiff_t const lengthPlace = lengthPosition - (packet[4] == 0 ? 16 : 0);
  FitArea(packet, lengthPlace);

  static IIPMILan& link = *IIPMILan::Initialize();
  bool const checksum = IsChecksumRight(packet, lengthPlace);
  bool const completed = IsCompleted(packet, lengthPlace);
  ExpectSame(link.ChkResponse(packet.data(), lengthPosition, 0), checksum && completed);
  ExpectSame(link.ChkResponse(packet.data(), lengthPosition, 1), checksum);
  ExpectSame(link.ChkResponse(packet.data(), lengthPosition, 2), completed);
  ExpectSame(link.ChkResponse(packet.data(), lengthPosition, 3), true);
  return 0;
}
