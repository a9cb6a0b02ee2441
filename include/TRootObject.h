// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "INamespaceProviderManager.h"
#include "ZEPExport.h"

namespace NQRVZEP20 {

class IIPMILan;
class ILogger;

// Access to the objects that exist once per process or once per thread. All functions are static.
class ZEP_EXPORT TRootObject {
public:
  static boost::shared_ptr<INamespaceProviderManager> GetNamespaceProviderManager();

  // The link to the management controller, which the library owns; null before IIPMILan::Initialize.
  static IIPMILan* GetipmiLanIns();

  // The calling thread's logger, which the library owns; never null.
  static ILogger* GetCoreLogger();
};

}  // namespace NQRVZEP20
