// SPDX-License-Identifier: Apache-2.0
#include "proxy/WpadQuery.h"

#include "TOSSpecific.h"
#include "TZEPException.h"

#include <string_view>

namespace NQRVZEP20 {
namespace {

constexpr int kCommandSilenceSeconds = 300;

std::string OutputOfIfconfig() {
  try {
    return TOSSpecific::SpawnProcess("ifconfig", {}, kCommandSilenceSeconds);
  } catch (TZEPException const&) {
    return "";
  }
}

}  // namespace

std::string ShownIPV6Address() {
  constexpr std::string_view kLabel = "inet6 addr: ";
  std::string const shown = OutputOfIfconfig();
  std::size_t const label = shown.find(kLabel);
  if (label == std::string::npos) return "";
  std::size_t const start = label + kLabel.size();
  return shown.substr(start, shown.find_first_of("/ \t\r\n", start) - start);
}

}  // namespace NQRVZEP20
