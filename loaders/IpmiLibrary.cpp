// SPDX-License-Identifier: Apache-2.0
#include "loaders/IpmiLibrary.h"

#include "TZEPException.h"
#include "core/Handles.h"

namespace NQRVZEP20 {
namespace {

// A pointer is null when the library lacks that function; the others can still be used.
struct TIpmiFunctions {
  decltype(&::OpenConnection) open;
  decltype(&::SendIpmiCommand) send;
  decltype(&::CloseConnection) close;
};

TIpmiFunctions LoadFunctions() {
  void* const library = ::dlopen("libipmiClient.so", RTLD_NOW);  // stays loaded
  if (library == nullptr) throw TZEPException(kZEPStatusFileSystemError);
  return {FunctionOf<decltype(::OpenConnection)>(library, "OpenConnection"),
          FunctionOf<decltype(::SendIpmiCommand)>(library, "SendIpmiCommand"),
          FunctionOf<decltype(::CloseConnection)>(library, "CloseConnection")};
}

// When LoadFunctions throws, the next call tries again.
TIpmiFunctions const& Functions() {
  static TIpmiFunctions const functions = LoadFunctions();
  return functions;
}

// Calls one of the functions. An exception that the function throws passes through.
template <class TFunction, class... TArguments>
int Call(TFunction TIpmiFunctions::*member, TArguments... arguments) {
  TFunction function = nullptr;
  try {
    function = Functions().*member;
  } catch (TZEPException const& failed) {
    return failed.GetStatusCode().GetCode();
  }
  return function != nullptr ? function(arguments...) : static_cast<int>(kZEPStatusNotFound);
}

}  // namespace

int OpenIpmiConnection(std::string const& host, std::string const& user, std::string const& password) {
  return Call(&TIpmiFunctions::open, kIpmiClientLan, host.c_str(), kIpmiPort, user.c_str(), password.c_str());
}

int SendIpmiCommand(TIpmiCommand const& command, TIpmiResponse& response) {
  response.fill(0);
  unsigned short length = 0;
  unsigned char completionCode = 0xFF;
  return Call(&TIpmiFunctions::send, command.command, command.request.data(), static_cast<int>(command.request.size()),
              response.data(), &length, &completionCode, command.netFn);
}

int CloseIpmiConnection() { return Call(&TIpmiFunctions::close); }

}  // namespace NQRVZEP20
