#include "platform/ipmi/TSession.h"

#include <freeipmi/freeipmi.h>
#include <string.h>

#include <algorithm>
#include <new>

namespace ipmi {
namespace {

// A controller that stays silent is given up about a second after the session's time-out. The same time-out ends a session
// in which nothing is asked; it is then opened again.
constexpr unsigned kSessionTimeoutMilliseconds = 4000;
constexpr unsigned kRetransmissionMilliseconds = 500;

// How a session is opened.
struct TWay {
  enum EVersion { kVersion2, kVersion15 } version;
  std::uint8_t cipherSuite;
  unsigned workarounds;
};

// Some controllers name no privilege when a session of version 2.0 is opened. Nothing is lost with the others: a privilege
// that cannot be had shows one step later. A session given up half open would take up room in the controller.
constexpr unsigned kNoPrivilegeNamed = IPMI_WORKAROUND_FLAGS_OUTOFBAND_2_0_OPEN_SESSION_PRIVILEGE;

constexpr TWay kWays[] = {
    {TWay::kVersion2, 3, kNoPrivilegeNamed},  {TWay::kVersion2, 3, 0},  //
    {TWay::kVersion2, 17, kNoPrivilegeNamed}, {TWay::kVersion2, 17, 0}, {TWay::kVersion15, 0, 0},
};
constexpr int kNumberOfWays = sizeof kWays / sizeof *kWays;

bool HasNoVersion2(int error) { return error == IPMI_ERR_IPMI_2_0_UNAVAILABLE; }

bool HasNoSuchCipherSuite(int error) { return error == IPMI_ERR_CIPHER_SUITE_ID_UNAVAILABLE || error == IPMI_ERR_IPMI_ERROR; }

// The next way that may do after one failed, or kNumberOfWays. Silence and a refused account end the same way however the
// session is opened, and a wrong password costs the whole time-out with version 1.5.
int WayBehind(int way, int error) {
  TWay const& failed = kWays[way];
  const auto isWorthTrying = [&](TWay const& next) {
    if (failed.version == TWay::kVersion15) return false;
    if (HasNoVersion2(error)) return next.version == TWay::kVersion15;
    if (HasNoSuchCipherSuite(error)) return next.cipherSuite != failed.cipherSuite;
    if (error == IPMI_ERR_PRIVILEGE_LEVEL_CANNOT_BE_OBTAINED)
      return next.cipherSuite == failed.cipherSuite && next.workarounds != failed.workarounds;
    return false;
  };
  return static_cast<int>(std::find_if(kWays + way + 1, kWays + kNumberOfWays, isWorthTrying) - kWays);
}

int StatusOf(int error) {
  switch (error) {
    case IPMI_ERR_SUCCESS:
      return kIpmiClientOk;
    case IPMI_ERR_PASSWORD_INVALID:
    case IPMI_ERR_PASSWORD_VERIFICATION_TIMEOUT:
      return kIpmiClientWrongPassword;
    case IPMI_ERR_USERNAME_INVALID:
      return kIpmiClientUnknownUser;
    case IPMI_ERR_CONNECTION_TIMEOUT:
    case IPMI_ERR_SESSION_TIMEOUT:
      return kIpmiClientNoAnswer;
    case IPMI_ERR_HOSTNAME_INVALID:
      return kIpmiClientHostUnknown;
    case IPMI_ERR_SYSTEM_ERROR:
      return kIpmiClientUnreachable;
    case IPMI_ERR_BMC_BUSY:
      return kIpmiClientBusy;
    case IPMI_ERR_PRIVILEGE_LEVEL_INSUFFICIENT:
    case IPMI_ERR_PRIVILEGE_LEVEL_CANNOT_BE_OBTAINED:
    case IPMI_ERR_AUTHENTICATION_TYPE_UNAVAILABLE:
    case IPMI_ERR_CIPHER_SUITE_ID_UNAVAILABLE:
    case IPMI_ERR_IPMI_2_0_UNAVAILABLE:
      return kIpmiClientRefused;
    case IPMI_ERR_PARAMETERS:
      return kIpmiClientBadArgument;
    case IPMI_ERR_OUT_OF_MEMORY:
      return kIpmiClientOutOfMemory;
    default:
      return kIpmiClientFail;
  }
}

// Host and port as libfreeipmi takes them; an IPv6 address needs brackets.
std::string HostAndPort(TTarget const& target) {
  const bool isBareVersion6 = target.host.find(':') != std::string::npos && target.host.front() != '[';
  return (isBareVersion6 ? "[" + target.host + "]" : target.host) + ":" + target.port;
}

int Open(ipmi_ctx_t context, TTarget const& target, TWay const& way) {
  const std::string host = HostAndPort(target);
  if (way.version == TWay::kVersion15)
    return ipmi_ctx_open_outofband(context, host.c_str(), target.user.c_str(), target.password.c_str(),
                                   IPMI_AUTHENTICATION_TYPE_MD5, IPMI_PRIVILEGE_LEVEL_ADMIN, kSessionTimeoutMilliseconds,
                                   kRetransmissionMilliseconds, IPMI_WORKAROUND_FLAGS_DEFAULT, IPMI_FLAGS_DEFAULT);
  return ipmi_ctx_open_outofband_2_0(context, host.c_str(), target.user.c_str(), target.password.c_str(), nullptr, 0,
                                     IPMI_PRIVILEGE_LEVEL_ADMIN, way.cipherSuite, kSessionTimeoutMilliseconds,
                                     kRetransmissionMilliseconds, way.workarounds, IPMI_FLAGS_DEFAULT);
}

}  // namespace

TTarget::~TTarget() { ::explicit_bzero(password.data(), password.size()); }

void TSession::TContextCloser::operator()(ipmi_ctx* context) const noexcept {
  ipmi_ctx_close(context);
  ipmi_ctx_destroy(context);
}

TSession::TSession(TTarget target) : fTarget(std::move(target)) {}

int TSession::TryToOpen(int way) {
  fContext.reset(ipmi_ctx_create());
  if (!fContext) throw std::bad_alloc();
  if (ipmi::Open(fContext.get(), fTarget, kWays[way]) == 0) return IPMI_ERR_SUCCESS;
  const int error = ipmi_ctx_errnum(fContext.get());
  fContext.reset();
  return error != IPMI_ERR_SUCCESS ? error : static_cast<int>(IPMI_ERR_INTERNAL_ERROR);
}

int TSession::Open() {
  int error = IPMI_ERR_INTERNAL_ERROR;
  for (int way = fWayThatWorked; way < kNumberOfWays; way = WayBehind(way, error)) {
    error = TryToOpen(way);
    if (error == IPMI_ERR_SUCCESS) {
      fWayThatWorked = way;
      break;
    }
  }
  return StatusOf(error);
}

int TSession::Send(unsigned char netFn, unsigned char command, TBytes request, TAnswer& answer) {
  std::vector<unsigned char> message = {command};
  message.insert(message.end(), request.data, request.data + request.size);
  int error = TryToSend(netFn, message, answer);
  if (error == IPMI_ERR_SESSION_TIMEOUT) {
    if (const int status = Open(); status != kIpmiClientOk) return status;
    error = TryToSend(netFn, message, answer);
  }
  return StatusOf(error);
}

int TSession::TryToSend(unsigned char netFn, std::vector<unsigned char> const& message, TAnswer& answer) {
  if (!fContext) return IPMI_ERR_SESSION_TIMEOUT;  // it expired, and could not be opened again
  constexpr std::size_t kBeforeData = 2;           // the command and the completion code
  std::array<unsigned char, kBeforeData + kIpmiClientResponseSize> response;
  const int length = ipmi_cmd_raw(fContext.get(), 0, netFn, message.data(), static_cast<unsigned>(message.size()),
                                  response.data(), static_cast<unsigned>(response.size()));
  if (length < 0) return ipmi_ctx_errnum(fContext.get());
  if (length < static_cast<int>(kBeforeData)) return IPMI_ERR_INTERNAL_ERROR;
  answer.completionCode = response[1];
  answer.length = static_cast<std::size_t>(length) - kBeforeData;
  std::copy_n(response.begin() + kBeforeData, answer.length, answer.data.begin());
  return IPMI_ERR_SUCCESS;
}

}  // namespace ipmi
