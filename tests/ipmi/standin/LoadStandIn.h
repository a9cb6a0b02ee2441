#pragma once

#include "core/Handles.h"
#include "tests/Support.h"
#include "tests/ipmi/standin/StandInIpmiClient.h"

namespace NQRVZEP20 {

// Loads the stand-in for libipmiClient.so ("whole", "without-open", ...) before the library looks for the real one, which
// then gets this. For the rest of the process.
inline TStandInIpmiClient& LoadStandInIpmiClient(std::string const& variant = "whole") {
  std::string const path = ZEP_IPMI_STANDINS "/" + variant + "/libipmiClient.so";
  void* const library = ::dlopen(path.c_str(), RTLD_NOW);
  if (library == nullptr) throw std::runtime_error(::dlerror());
  TStandInIpmiClient& standIn = *FunctionOf<decltype(StandInIpmiClient)>(library, "StandInIpmiClient")();
  standIn = {};
  return standIn;
}

// What the function logs, on a thread of its own; the stand-ins' calls begin with "> ".
template <class TFunction>
std::vector<std::string> LogOf(TFunction function) {
  std::vector<std::string> entries;
  OnNewThread([&] {
    TLogCapture const log;
    function();
    entries = log.Entries();
  });
  return entries;
}

}  // namespace NQRVZEP20
