// SPDX-License-Identifier: Apache-2.0
#include "FillLog.h"

#include "ILogger.h"
#include "TRootObject.h"

namespace NQRVZEP20 {

void LogRefusal(std::string const& className, std::string const& member, TZEPException const& reason) {
  std::string const element = member.empty() ? className : className + "." + member;
  TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogError, element + " refused: " + reason.what());
}

}  // namespace NQRVZEP20
