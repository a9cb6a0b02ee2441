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

// The identity of a remote server, as its controller reports it.
struct TRemoteIdentity {
  std::string fHost;
  std::string fType, fModel, fSerialNumber;  // empty: not reported
  std::string fError;                        // why something was not reported; empty when all was
};

// Whether the text may be the name or the address of a host: it consists of letters, digits, "-", "." and "_", or is an IPv6
// address. Neither "user:secret@host" nor "host secret" is accepted.
bool IsHostName(std::string const& host);
constexpr char const* kNoHostName =
    "not a host name or address; give the account with --user, and its password with --password-file or ZEP_BMC_PASSWORD";

// Queries the controller, and sends each field as soon as it is known, in the form that IdentityFrom reads; to be called in a
// child process. Only a host name is queried.
void QueryController(std::string const& host, TAccount const& account, TSend const& send);

// The identity in what the child process sent. `isComplete` is false when the child did not finish.
TRemoteIdentity IdentityFrom(std::string const& host, std::string const& sent, bool isComplete);

bool IsComplete(TRemoteIdentity const& identity);
bool IsNothing(TRemoteIdentity const& identity);

// The exit status of zep when this is its only host.
EExitStatus StatusOf(TRemoteIdentity const& identity);

// The JSON document of "zep remote".
TJson AsJson(TRemoteIdentity const& identity);
std::string AsText(TRemoteIdentity const& identity);

}  // namespace NQRVZEP20::zep
