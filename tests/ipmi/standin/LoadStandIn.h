// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"
#include "tests/LogOf.h"
#include "tests/ipmi/standin/StandInIpmiClient.h"

namespace NQRVZEP20 {

// Loads a stand-in for libipmiClient.so ("whole", "without-open", ...). The core library then uses it instead of the real
// one, for the rest of the process. Log lines that begin with "> " record the calls of the stand-in.
inline TStandInIpmiClient& LoadStandInIpmiClient(std::string const& variant = "whole") {
  std::string const path = ZEP_IPMI_STANDINS "/" + variant + "/libipmiClient.so";
  void* const library = ::dlopen(path.c_str(), RTLD_NOW);
  if (library == nullptr) throw std::runtime_error(::dlerror());
  TStandInIpmiClient& standIn = *FunctionOf<decltype(StandInIpmiClient)>(library, "StandInIpmiClient")();
  standIn = {};
  return standIn;
}

}  // namespace NQRVZEP20
