// SPDX-License-Identifier: Apache-2.0
#include "loaders/IpmiLibrary.h"

#include "loaders/TKeptLibrary.h"

#include <algorithm>

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

TIpmiResult Send(TIpmiCommand const& command, TIpmiResponse& response, unsigned short& length, unsigned char& completionCode) {
  response.fill(0);
  return Call("SendIpmiCommand", &TIpmiFunctions::fSend, command.fCommand, command.fRequest.data(),
              static_cast<int>(command.fRequest.size()), response.data(), &length, &completionCode, command.fNetFn);
}

}  // namespace

TIpmiResult OpenIpmiConnection(std::string const& host, std::string const& user, std::string const& password) {
  return Call("OpenConnection", &TIpmiFunctions::fOpen, kIpmiClientLan, host.c_str(), kIpmiPort, user.c_str(), password.c_str());
}

TIpmiResult SendIpmiCommand(TIpmiCommand const& command, TIpmiResponse& response) {
  unsigned short length = 0;
  unsigned char completionCode = 0xFF;
  return Send(command, response, length, completionCode);
}

TIpmiAnswer AskIpmiController(TIpmiCommand const& command) {
  TIpmiResponse response;
  unsigned short length = 0;
  unsigned char completionCode = 0xFF;
  TIpmiResult const result = Send(command, response, length, completionCode);
  bool const isAnswered = result || (result.fLoad && result.fCode == kIpmiClientCompletionCode);
  if (!isAnswered) return {};
  std::size_t const count = std::min<std::size_t>(length, kIpmiClientResponseSize);
  return {true,
          result ? static_cast<unsigned char>(0) : completionCode,
          {response.begin(), response.begin() + static_cast<long>(count)}};
}

TIpmiResult CloseIpmiConnection() { return Call("CloseConnection", &TIpmiFunctions::fClose); }

}  // namespace NQRVZEP20
