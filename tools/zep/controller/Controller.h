// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/controller/Inventory.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/processes/TChildProcess.h"
#include "tools/zep/secrets/TSecret.h"

#include <optional>
#include <string>

namespace NQRVZEP20::zep {

struct TAccount {
  std::string fUser;
  TSecret fPassword;
};

// The identity of a remote server, as its controller reports it.
struct TRemoteIdentity {
  std::string fHost;
  std::string fType, fModel, fSerialNumber;  // empty if not reported
  std::string fError;                        // why a field was not reported; empty if all were
  std::optional<TInventory> fInventory;      // only if it was requested
};

// Whether the string can be the name or the address of a host: it consists of letters, digits, "-", "." and "_", or is an IPv6
// address. Neither "user:secret@host" nor "host secret" is accepted.
bool IsHostName(std::string const& host);
constexpr char const* kNoHostName =
    "not a host name or address; give the account with --user, and its password with --password-file or ZEP_BMC_PASSWORD";

// Queries the controller and sends each field as soon as it is known, in the format that IdentityFrom parses. Call it in a
// child process. Does not query a host for which IsHostName is false.
// `inventory`: null if none is requested; otherwise the inventory follows the fields.
void QueryController(std::string const& host, TAccount const& account, TInventoryLimits const* inventory, TSend const& send);

// Parses the data that the child process sent. `isComplete` is false if the child did not finish.
TRemoteIdentity IdentityFrom(std::string const& host, std::string const& sent, bool isComplete, bool hasInventory = false);

bool IsComplete(TRemoteIdentity const& identity);
bool IsNothing(TRemoteIdentity const& identity);

// The exit status of zep if this is the only host.
EExitStatus StatusOf(TRemoteIdentity const& identity);

// The JSON document of "zep remote". `thresholds`: for the findings of the inventory.
TJson AsJson(TRemoteIdentity const& identity, TThresholds const& thresholds = {});
std::string AsText(TRemoteIdentity const& identity, TThresholds const& thresholds = {});

}  // namespace NQRVZEP20::zep
