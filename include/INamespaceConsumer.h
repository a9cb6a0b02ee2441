// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

namespace NQRVZEP20 {

// The base of the object that a consumer plug-in's factory function creates. Consumers read namespaces. Host and consumer
// agree on a class of their own derived from this one; the library only passes the pointer on.
class ZEP_EXPORT INamespaceConsumer {
public:
  virtual ~INamespaceConsumer();
};

}  // namespace NQRVZEP20
