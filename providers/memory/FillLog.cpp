// SPDX-License-Identifier: Apache-2.0
#include "FillLog.h"

#include "ILogger.h"
#include "TRootObject.h"
#include "TZEPFailure.h"

namespace NQRVZEP20 {

void ThrowRefusal(std::string const& className, std::string const& member, TZEPException const& cause) {
  std::string const refused = member.empty() ? className : className + "." + member;
  auto const* const failure = dynamic_cast<TZEPFailure const*>(&cause);
  std::string const reason = refused + " refused: " + cause.what() + (failure != nullptr ? ": " + failure->Reason() : "");
  TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogError, reason);
  throw TZEPFailure(cause.GetStatusCode(), reason);
}

}  // namespace NQRVZEP20
