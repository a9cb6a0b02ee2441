#include "TRootObject.h"

#include "TLogger.h"
#include "TNamespaceProviderManager.h"

namespace NQRVZEP20 {

boost::shared_ptr<INamespaceProviderManager> TRootObject::GetNamespaceProviderManager() {
  return TNamespaceProviderManager::GetInstance();
}

ILogger* TRootObject::GetCoreLogger() { return TLogger::GetInstance(); }

}  // namespace NQRVZEP20
