// The functions of libipmiClient.so.

#include "platform/include/ipmiClient.h"

#include "platform/ipmi/TSession.h"

#include <cstring>
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
  const int result = Session()->Open();
  if (result != kIpmiClientOk) CloseConnection();
  return result;
} catch (std::bad_alloc const&) {
  return kIpmiClientOutOfMemory;
}

int SendIpmiCommand(unsigned char command, unsigned char const* request, int requestLength, unsigned char* response,
                    unsigned short* responseLength, unsigned char* completionCode, unsigned char netFn) try {
  if (!response || !responseLength || !completionCode || (!request && requestLength > 0)) return kIpmiClientBadArgument;
  if (requestLength < 0 || requestLength > ipmi::kMaxRequestLength) return kIpmiClientBadArgument;
  *responseLength = 0;
  if (!Session()) return kIpmiClientNoSession;

  ipmi::TAnswer answer;
  const int result = Session()->Send(netFn, command, {request, static_cast<std::size_t>(requestLength)}, answer);
  if (result != kIpmiClientOk) return result;
  *completionCode = answer.completionCode;
  *responseLength = static_cast<unsigned short>(answer.length);
  std::memcpy(response, answer.data.data(), answer.length);
  return answer.completionCode == 0 ? kIpmiClientOk : kIpmiClientCompletionCode;
} catch (std::bad_alloc const&) {
  return kIpmiClientOutOfMemory;
}

int CloseConnection() {
  Session().reset();
  return kIpmiClientOk;
}

#pragma GCC visibility pop
