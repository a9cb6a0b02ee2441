// SPDX-License-Identifier: Apache-2.0
#include "Ipmi.h"

#include "IpmiText.h"

namespace NQRVZEP20 {

namespace {

std::string NameOf(TIpmiRequest const& request) {
  std::string const bytes = {static_cast<char>(request.fNetFn), static_cast<char>(request.fCommand)};
  return "the command 0x" + HexText(bytes.substr(1)) + " of network function 0x" + HexText(bytes.substr(0, 1));
}

}  // namespace

TFinding<std::string> Ask(TIpmi const& ipmi, TIpmiRequest const& request, std::size_t leastLength) {
  return ipmi(request).Then([&](std::string const& answer) -> TFinding<std::string> {
    if (answer.empty()) return TMissing{kMissingUnexpected, "the answer to " + NameOf(request) + " is empty"};
    if (answer.front() != '\0')
      return TMissing{kMissingRefused,
                      "the controller refused " + NameOf(request) + " (completion code 0x" + HexText(answer.substr(0, 1)) + ")"};
    if (answer.size() - 1 < leastLength)
      return TMissing{kMissingUnexpected, "the answer to " + NameOf(request) + " is too short"};
    return answer.substr(1);
  });
}

}  // namespace NQRVZEP20
