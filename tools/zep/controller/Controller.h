// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/output/Json.h"
#include "tools/zep/processes/TChildProcess.h"
#include "tools/zep/secrets/TSecret.h"

#include <string>

namespace NQRVZEP20::zep {

struct TAccount {
  std::string fUser;
  TSecret fPassword;
};

// What a remote server's controller tells of it.
struct TRemoteIdentity {
  std::string fHost;
  std::string fType, fModel, fSerialNumber;  // empty: not told
  std::string fError;                        // why something was not told; empty when all was
};

// Whether it may be the name or the address of a host: of letters, digits, "-", "." and "_", or an IPv6 address. Neither
// "user:secret@host" nor "host secret" is one.
bool IsHostName(std::string const& host);
constexpr char const* kNoHostName =
    "not a host name or an address; the account is named by --user, and its password is in --password-file or ZEP_BMC_PASSWORD";

// Queries the controller, and sends each field as soon as it is known, in the form that IdentityFrom reads; to be called in a
// child process. Only a host name is queried.
void AskController(std::string const& host, TAccount const& account, TSend const& send);

// The identity in what the child process sent. `isComplete` is false when the child did not finish.
TRemoteIdentity IdentityFrom(std::string const& host, std::string const& sent, bool isComplete);

bool IsComplete(TRemoteIdentity const& identity);
bool IsNothing(TRemoteIdentity const& identity);

// What zep ends with when it asks for this one alone.
EExitStatus StatusOf(TRemoteIdentity const& identity);

// A document of "zep remote".
TJson AsJson(TRemoteIdentity const& identity);
std::string AsText(TRemoteIdentity const& identity);

}  // namespace NQRVZEP20::zep
