#pragma once

#include "ZEPExport.h"

namespace NQRVZEP20 {

// What a consumer plug-in's factory makes. Consumers read namespaces; host and consumer agree on a class of their own,
// derived from this one, and the library only hands the pointer through.
class ZEP_EXPORT INamespaceConsumer {
public:
  virtual ~INamespaceConsumer();
};

}  // namespace NQRVZEP20
