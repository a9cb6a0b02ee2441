// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/include/ipmiClient.h"

#include <array>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The platform library libipmiClient.so, for the rooms that talk to a management controller. It is loaded by its plain name
// on first use and then stays loaded; as long as loading fails, each call tries again. Exceptions thrown by the library pass
// through.
//
// Each function returns the library's result, 0 for success; kZEPStatusFileSystemError when the library cannot be loaded,
// and kZEPStatusNotFound when it lacks the function.

constexpr char const* kIpmiPort = "623";

// Opens a session over the LAN, on port kIpmiPort.
int OpenIpmiConnection(std::string const& host, std::string const& user, std::string const& password);

struct TIpmiCommand {
  unsigned char netFn, command;
  std::vector<unsigned char> request;
};

// The response as the library wrote it. Bytes that it did not write are 0; the last byte is always 0.
using TIpmiResponse = std::array<unsigned char, kIpmiClientResponseSize + 1>;

int SendIpmiCommand(TIpmiCommand const& command, TIpmiResponse& response);

int CloseIpmiConnection();

}  // namespace NQRVZEP20
