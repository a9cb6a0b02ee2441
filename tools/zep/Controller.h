#pragma once

#include "Json.h"

#include <string>

namespace NQRVZEP20::zep {

struct TAccount {
  std::string fUser, fPassword;
};

// What a remote server's controller tells of it.
struct TRemoteIdentity {
  std::string fHost;
  std::string fType, fModel, fSerialNumber;  // empty: not told
  std::string fError;                        // why something was not told; empty when all was
};

// Asks the controller; to be called in a process of its own. The result is for IdentityFrom.
std::string AskController(std::string const& host, TAccount const& account);

// Puts together what the process said. `isComplete` is false when it did not come to its end.
TRemoteIdentity IdentityFrom(std::string const& host, std::string const& said, bool isComplete);

bool IsComplete(TRemoteIdentity const& identity);
bool IsNothing(TRemoteIdentity const& identity);

// What zep ends with when it asks for this one alone.
EExitStatus StatusOf(TRemoteIdentity const& identity);

// A document of "zep remote".
TJson AsJson(TRemoteIdentity const& identity);
std::string AsText(TRemoteIdentity const& identity);

}  // namespace NQRVZEP20::zep
