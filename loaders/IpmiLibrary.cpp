// SPDX-License-Identifier: Apache-2.0
#include "loaders/IpmiLibrary.h"

#include "loaders/TKeptLibrary.h"

namespace NQRVZEP20 {
namespace {

struct TIpmiFunctions {
  decltype(&::OpenConnection) fOpen = nullptr;
  decltype(&::SendIpmiCommand) fSend = nullptr;
  decltype(&::CloseConnection) fClose = nullptr;

  static TLibraryPlace Place() { return {{"libipmiClient.so"}, RTLD_NOW}; }
  std::vector<TLibraryFunction> Table() {
    return {{"OpenConnection", fOpen, TLibraryFunction::kOptional},
            {"SendIpmiCommand", fSend, TLibraryFunction::kOptional},
            {"CloseConnection", fClose, TLibraryFunction::kOptional}};
  }
};

template <class TFunction, class... TArguments>
TIpmiResult Call(char const* name, TFunction TIpmiFunctions::*function, TArguments... arguments) {
  auto const library = TKeptLibrary<TIpmiFunctions>::Get();
  if (!library->Outcome()) return {library->Outcome()};
  TFunction const called = (**library).*function;
  if (called == nullptr) return {{TLoadOutcome::kFunctionMissing, std::string("the function ") + name + " is missing"}};
  return {{}, called(arguments...)};
}

}  // namespace

TIpmiResult OpenIpmiConnection(std::string const& host, std::string const& user, std::string const& password) {
  return Call("OpenConnection", &TIpmiFunctions::fOpen, kIpmiClientLan, host.c_str(), kIpmiPort, user.c_str(), password.c_str());
}

TIpmiResult SendIpmiCommand(TIpmiCommand const& command, TIpmiResponse& response) {
  response.fill(0);
  unsigned short length = 0;
  unsigned char completionCode = 0xFF;
  return Call("SendIpmiCommand", &TIpmiFunctions::fSend, command.fCommand, command.fRequest.data(),
              static_cast<int>(command.fRequest.size()), response.data(), &length, &completionCode, command.fNetFn);
}

TIpmiResult CloseIpmiConnection() { return Call("CloseConnection", &TIpmiFunctions::fClose); }

}  // namespace NQRVZEP20
