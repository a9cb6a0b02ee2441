// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

namespace NQRVZEP20 {

// The base class of the object that the factory function of a consumer plug-in creates. Consumers read namespaces. Host and
// consumer agree on a class derived from this one; the library only passes the pointer on.
class ZEP_EXPORT INamespaceConsumer {
public:
  virtual ~INamespaceConsumer();
};

}  // namespace NQRVZEP20
