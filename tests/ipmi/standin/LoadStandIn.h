#pragma once

#include "core/Handles.h"
#include "tests/LogOf.h"
#include "tests/ipmi/standin/StandInIpmiClient.h"

namespace NQRVZEP20 {

// Loads the stand-in for libipmiClient.so ("whole", "without-open", ...) before the library looks for the real one, which
// then gets this. For the rest of the process. Its calls are in the log and begin with "> ".
inline TStandInIpmiClient& LoadStandInIpmiClient(std::string const& variant = "whole") {
  std::string const path = ZEP_IPMI_STANDINS "/" + variant + "/libipmiClient.so";
  void* const library = ::dlopen(path.c_str(), RTLD_NOW);
  if (library == nullptr) throw std::runtime_error(::dlerror());
  TStandInIpmiClient& standIn = *FunctionOf<decltype(StandInIpmiClient)>(library, "StandInIpmiClient")();
  standIn = {};
  return standIn;
}

}  // namespace NQRVZEP20
