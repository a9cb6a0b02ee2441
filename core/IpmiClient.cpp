#include "core/IpmiClient.h"

#include "TZEPStatusCode.h"
#include "core/Handles.h"

namespace NQRVZEP20 {
namespace {

constexpr char const* kPort = "623";

// Null while the library cannot be had.
void* LoadedLibrary() {
  static void* library = nullptr;
  if (library == nullptr) library = ::dlopen("libipmiClient.so", RTLD_NOW);
  return library;
}

// Calls the function of that name with the arguments.
template <class TFunction, class... TArguments>
int Call(char const* name, TArguments... arguments) {
  void* const library = LoadedLibrary();
  if (library == nullptr) return kZEPStatusFileSystemError;
  TFunction* const function = FunctionOf<TFunction>(library, name);
  return function != nullptr ? function(arguments...) : static_cast<int>(kZEPStatusNotFound);
}

}  // namespace

int OpenIpmiConnection(std::string const& host, std::string const& user, std::string const& password) {
  return Call<decltype(::OpenConnection)>("OpenConnection", kIpmiClientLan, host.c_str(), kPort, user.c_str(), password.c_str());
}

int SendIpmiCommand(TIpmiCommand const& command, TIpmiResponse& response) {
  response.fill(0);
  unsigned short length = 0;
  unsigned char completionCode = 0xFF;
  return Call<decltype(::SendIpmiCommand)>("SendIpmiCommand", command.command, command.request.data(),
                                           static_cast<int>(command.request.size()), response.data(), &length, &completionCode,
                                           command.netFn);
}

int CloseIpmiConnection() { return Call<decltype(::CloseConnection)>("CloseConnection"); }

}  // namespace NQRVZEP20
