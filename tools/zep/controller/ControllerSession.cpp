// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/controller/ControllerSession.h"

#include "loaders/IpmiLibrary.h"
#include "tools/zep/controller/Controller.h"
#include "tools/zep/output/Failure.h"

namespace NQRVZEP20::zep {

namespace {

struct TReason {
  int fCode;  // returned by OpenConnection
  char const* fText;
};

constexpr TReason kReasons[] = {
    {kIpmiClientWrongPassword, "wrong password"},
    {kIpmiClientUnknownUser, "unknown user, or the account is disabled"},
    {kIpmiClientNoAnswer, "no answer"},
    {kIpmiClientHostUnknown, "the host name has no address"},
    {kIpmiClientUnreachable, "this system cannot send to the host"},
    {kIpmiClientBusy, "the controller has no free session"},
    {kIpmiClientRefused, "the account lacks administrator privilege, or no common cipher suite exists"},
    {kIpmiClientBadArgument, "the user name or the password cannot be used; it may be too long"},
    {kIpmiClientCompletionCode, "the controller did not execute a command"},
    {kIpmiClientOutOfMemory, "libipmiClient.so ran out of memory"},
    {kIpmiClientFail, "the controller's answers are invalid"},
};

std::string ReasonOf(int code) {
  for (TReason const& reason : kReasons)
    if (reason.fCode == code) return reason.fText;
  return "error " + std::to_string(code) + " of libipmiClient.so";
}

std::string ReasonOf(TIpmiResult const& result) {
  switch (result.fLoad.fKind) {
    case TLoadOutcome::kNotLoaded:
      return "libipmiClient.so cannot be loaded (" + result.fLoad.fReason + "); install the package libzepcore-ipmi";
    case TLoadOutcome::kFunctionMissing:
      return "libipmiClient.so cannot be used: " + result.fLoad.fReason;
    case TLoadOutcome::kComplete:
      break;
  }
  return ReasonOf(result.fCode);
}

}  // namespace

std::string WhyNoSession(std::string const& host, TAccount const& account) {
  TIpmiResult result;
  std::string const password = account.fPassword.ForLibrary();
  std::string const failure = FailureOf([&] { result = OpenIpmiConnection(host, account.fUser, password); });
  if (!failure.empty()) return failure;
  return result ? "" : ReasonOf(result);
}

}  // namespace NQRVZEP20::zep
