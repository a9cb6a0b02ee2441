// SPDX-License-Identifier: Apache-2.0

// The functions of libipmiClient.so.

#include "platform/include/ipmiClient.h"

#include "platform/ipmi/Failure.h"
#include "platform/ipmi/TSession.h"

#include <algorithm>
#include <new>
#include <optional>

namespace {

using ipmi::TSession;

// The session of the process.
std::optional<TSession>& Session() {
  static std::optional<TSession> session;
  return session;
}

}  // namespace

#pragma GCC visibility push(default)

int OpenConnection(int mode, char const* host, char const* port, char const* user, char const* password) try {
  CloseConnection();
  if (mode != kIpmiClientLan || !host || !port || !user || !password) return kIpmiClientBadArgument;
  if (*host == '\0') return kIpmiClientHostUnknown;
  Session().emplace(ipmi::TTarget{host, port, user, password});
  Session()->Open();
  return kIpmiClientOk;
} catch (ipmi::TFailure const& failure) {
  Session().reset();
  return failure.fStatus;
} catch (std::bad_alloc const&) {
  Session().reset();
  return kIpmiClientOutOfMemory;
}

int SendIpmiCommand(unsigned char command, unsigned char const* request, int requestLength, unsigned char* response,
                    unsigned short* responseLength, unsigned char* completionCode, unsigned char netFn) try {
  if (!response || !responseLength || !completionCode || (!request && requestLength > 0)) return kIpmiClientBadArgument;
  if (requestLength < 0 || requestLength > ipmi::kMaxRequestLength) return kIpmiClientBadArgument;
  *responseLength = 0;
  if (!Session()) return kIpmiClientNoSession;

  ipmi::TReply const reply = Session()->Send(netFn, command, ipmi::TByteVector(request, request + requestLength));
  *completionCode = reply.fCompletionCode;
  *responseLength = static_cast<unsigned short>(reply.fData.size());
  std::copy(reply.fData.begin(), reply.fData.end(), response);
  return reply.fCompletionCode == 0 ? kIpmiClientOk : kIpmiClientCompletionCode;
} catch (ipmi::TFailure const& failure) {
  return failure.fStatus;
} catch (std::bad_alloc const&) {
  return kIpmiClientOutOfMemory;
}

int CloseConnection() {
  Session().reset();
  return kIpmiClientOk;
}

#pragma GCC visibility pop
