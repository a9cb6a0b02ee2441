// SPDX-License-Identifier: Apache-2.0
#include "Ipmi.h"

#include "IpmiText.h"
#include "TBytes.h"

#include <algorithm>
#include <iterator>

namespace NQRVZEP20 {

namespace {

std::string NameOf(TIpmiRequest const& request) {
  std::string const bytes = {static_cast<char>(request.fNetFn), static_cast<char>(request.fCommand)};
  return "the command 0x" + HexText(bytes.substr(1)) + " of network function 0x" + HexText(bytes.substr(0, 1));
}

}  // namespace

TFinding<std::string> DataOf(TFinding<std::string> const& answer, TIpmiRequest const& request, std::size_t leastLength) {
  return answer.Then([&](std::string const& bytes) -> TFinding<std::string> {
    if (bytes.empty()) return TMissing{kMissingUnexpected, "the answer to " + NameOf(request) + " is empty"};
    if (bytes.front() != '\0')
      return TMissing{kMissingRefused,
                      "the controller refused " + NameOf(request) + " (completion code 0x" + HexText(bytes.substr(0, 1)) + ")"};
    if (bytes.size() - 1 < leastLength) return TMissing{kMissingUnexpected, "the answer to " + NameOf(request) + " is too short"};
    return bytes.substr(1);
  });
}

TFinding<std::string> Ask(TIpmi const& ipmi, TIpmiRequest const& request, std::size_t leastLength) {
  return DataOf(ipmi(request), request, leastLength);
}

bool RefusesLength(TFinding<std::string> const& answer) {
  constexpr std::uint8_t codes[] = {0xC7, 0xC8, 0xCA, 0xFF};  // lengths of request and answer; unspecified
  return answer && std::find(std::begin(codes), std::end(codes), TBytes(*answer).At(0)) != std::end(codes);
}

}  // namespace NQRVZEP20
