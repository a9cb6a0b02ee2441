#pragma once

#include "platform/include/ipmiClient.h"

#include <array>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The platform library libipmiClient.so, for the rooms that talk to a management controller. It is loaded by its plain name
// when first needed and then stays loaded; while it cannot be had, each call tries again. What it throws passes through.
//
// Each function returns what the library returns, 0 for success; kZEPStatusFileSystemError when it could not be loaded,
// kZEPStatusNotFound when it lacks the function.

constexpr char const* kIpmiPort = "623";

// Opens a session over the LAN, on that port.
int OpenIpmiConnection(std::string const& host, std::string const& user, std::string const& password);

struct TIpmiCommand {
  unsigned char netFn, command;
  std::vector<unsigned char> request;
};

// What the library wrote; zeros where it wrote nothing. The last byte is never written.
using TIpmiResponse = std::array<unsigned char, kIpmiClientResponseSize + 1>;

int SendIpmiCommand(TIpmiCommand const& command, TIpmiResponse& response);

int CloseIpmiConnection();

}  // namespace NQRVZEP20
