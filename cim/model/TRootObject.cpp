// SPDX-License-Identifier: Apache-2.0
#include "TRootObject.h"

#include "IIPMILan.h"
#include "TLogger.h"
#include "TNamespaceProviderManager.h"

namespace NQRVZEP20 {

boost::shared_ptr<INamespaceProviderManager> TRootObject::GetNamespaceProviderManager() {
  return TNamespaceProviderManager::GetInstance();
}

IIPMILan* TRootObject::GetipmiLanIns() { return IIPMILan::GetInstance(); }

ILogger* TRootObject::GetCoreLogger() { return TLogger::GetInstance(); }

}  // namespace NQRVZEP20
