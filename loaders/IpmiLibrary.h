// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "loaders/TLoadedLibrary.h"
#include "platform/include/ipmiClient.h"

#include <array>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The platform library libipmiClient.so, for the rooms that talk to a management controller. It is loaded by its plain name on
// first use and then stays loaded; while loading fails, each call tries again. If the library lacks a function, only calls of
// that function fail. Exceptions thrown by the library pass through.

// The result of a call of the library.
struct TIpmiResult {
  TLoadOutcome fLoad;  // whether the function could be called
  int fCode = 0;       // returned by the function, if it was called; kIpmiClientOk or an error of the library

  explicit operator bool() const { return fLoad && fCode == kIpmiClientOk; }
};

constexpr char const* kIpmiPort = "623";

// Opens a session over the LAN, on port kIpmiPort.
TIpmiResult OpenIpmiConnection(std::string const& host, std::string const& user, std::string const& password);

struct TIpmiCommand {
  unsigned char fNetFn, fCommand;
  std::vector<unsigned char> fRequest;
};

// The response as the library wrote it. Bytes that it did not write are 0; the last byte is always 0.
using TIpmiResponse = std::array<unsigned char, kIpmiClientResponseSize + 1>;

TIpmiResult SendIpmiCommand(TIpmiCommand const& command, TIpmiResponse& response);

// The answer of the controller: the completion code and the data after it.
struct TIpmiAnswer {
  bool fIsAnswered = false;  // false if the command could not be sent, or was not answered
  unsigned char fCompletionCode = 0xFF;
  std::vector<unsigned char> fData = {};  // at most kIpmiClientResponseSize bytes
};
TIpmiAnswer AskIpmiController(TIpmiCommand const& command);

TIpmiResult CloseIpmiConnection();

}  // namespace NQRVZEP20
