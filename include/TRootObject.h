#pragma once

#include "INamespaceProviderManager.h"
#include "ZEPExport.h"

namespace NQRVZEP20 {

class IIPMILan;
class ILogger;

// Where a host starts: the way to the process-wide objects.
class ZEP_EXPORT TRootObject {
public:
  static boost::shared_ptr<INamespaceProviderManager> GetNamespaceProviderManager();

  // The link to the management controller; null before IIPMILan::Initialize.
  static IIPMILan* GetipmiLanIns();

  // The calling thread's logger. The library's own; never null.
  static ILogger* GetCoreLogger();
};

}  // namespace NQRVZEP20
