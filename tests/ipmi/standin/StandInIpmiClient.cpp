// SPDX-License-Identifier: Apache-2.0
#include "tests/ipmi/standin/StandInIpmiClient.h"

#include "ILogger.h"
#include "TRootObject.h"
#include "platform/include/ipmiClient.h"

#include <algorithm>
#include <cstdio>

namespace {

TStandInIpmiClient gStandIn;

void Record(std::string const& call) {
  using namespace NQRVZEP20;
  TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogDebug, "> " + call);
}

[[maybe_unused]] std::string Hex(unsigned char byte) {
  char text[8];
  std::snprintf(text, sizeof text, "%02x", byte);
  return text;
}

}  // namespace

#pragma GCC visibility push(default)

TStandInIpmiClient* StandInIpmiClient() { return &gStandIn; }

#ifndef STANDIN_WITHOUT_OPEN
int OpenConnection(int mode, char const* host, char const* port, char const* user, char const* password) {
  Record("OpenConnection(" + std::to_string(mode) + ", " + host + ", " + port + ", " + user + ", " + password + ")");
  if (gStandIn.fAtOpen) gStandIn.fAtOpen();
  if (gStandIn.fThrownByOpen != 0) throw gStandIn.fThrownByOpen;
  return gStandIn.fOpenResult;
}
#endif

#ifndef STANDIN_WITHOUT_SEND
int SendIpmiCommand(unsigned char command, unsigned char const* request, int requestLength, unsigned char* response,
                    unsigned short* responseLength, unsigned char* completionCode, unsigned char netFn) {
  std::string bytes;
  for (int place = 0; place < requestLength; ++place) bytes += " " + Hex(request[place]);
  bool const isCleared = std::all_of(response, response + kIpmiClientResponseSize, [](unsigned char byte) { return byte == 0; });
  Record("SendIpmiCommand(" + Hex(command) + "," + bytes + ", " + std::to_string(requestLength) + ", " +
         (isCleared ? "cleared" : "used") + " buffer, " + std::to_string(*responseLength) + ", " + Hex(*completionCode) + ", " +
         Hex(netFn) + ")");
  std::copy(gStandIn.fResponse.begin(), gStandIn.fResponse.end(), response);
  *responseLength = static_cast<unsigned short>(gStandIn.fResponseLength < 0 ? static_cast<int>(gStandIn.fResponse.size())
                                                                             : gStandIn.fResponseLength);
  *completionCode = 0;
  return gStandIn.fSendResult;
}
#endif

#ifndef STANDIN_WITHOUT_CLOSE
int CloseConnection() {
  Record("CloseConnection()");
  return 0;
}
#endif

#pragma GCC visibility pop
