// SPDX-License-Identifier: Apache-2.0
#include "PciLink.h"

#include <charconv>
#include <cmath>

namespace NQRVZEP20 {

TFinding<float> PciTransferRateFrom(std::string const& text) {
  if (text == "Unknown") return TMissing{kMissingNotGiven, "the kernel reports it as unknown"};
  float rate = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), rate);
  bool const hasUnit = text.compare(static_cast<std::size_t>(end - text.data()), 5, " GT/s") == 0;
  if (error == std::errc() && hasUnit && rate > 0 && rate < 10000) return rate;
  return TMissing{kMissingUnexpected, "\"" + text + "\" is not a transfer rate in GT/s"};
}

TFinding<std::uint16_t> PciWidthFrom(std::uint16_t width) {
  if (width == 0 || width == 255) return TMissing{kMissingNotGiven, "the kernel reports it as unknown"};
  return width;
}

std::uint64_t PciSpeedFrom(float transferRate, std::uint16_t width) {
  double const share = transferRate <= 5 ? 0.8 : transferRate <= 32 ? 128.0 / 130.0 : 1.0;
  return static_cast<std::uint64_t>(std::llround(double(transferRate) * 1e9 * share * width));
}

}  // namespace NQRVZEP20
