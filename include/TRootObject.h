// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "INamespaceProviderManager.h"
#include "ZEPExport.h"

namespace NQRVZEP20 {

class IIPMILan;
class ILogger;

// Access to the objects of which the process has one, or one per thread. Static operations only.
class ZEP_EXPORT TRootObject {
public:
  static boost::shared_ptr<INamespaceProviderManager> GetNamespaceProviderManager();

  // The link to the management controller; null before IIPMILan::Initialize. The library owns it.
  static IIPMILan* GetipmiLanIns();

  // The calling thread's logger. The library owns it; never null.
  static ILogger* GetCoreLogger();
};

}  // namespace NQRVZEP20
