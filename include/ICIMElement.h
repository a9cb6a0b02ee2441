#pragma once

#include "TCIMValue.h"
#include "ZEPExport.h"

#include <boost/function.hpp>
#include <boost/shared_ptr.hpp>
#include <boost/weak_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

// What an object path can name: a class or an instance. The root of the object model interfaces.
//
// The object model belongs to plug-ins: the library reaches classes, instances and qualifiers only through these
// interfaces and stores none of its own. For all of them:
//
// - Objects are passed and held as boost::shared_ptr. A back-pointer, from an element to its namespace or owner, is a
//   boost::weak_ptr; locking one whose target is gone throws boost::bad_weak_ptr.
// - The last argument of every operation is a context: named values that a caller carries to the plug-in. Pass an empty
//   TCIMContext() unless there is something to carry. A plug-in that knows nothing of an entry ignores it.
// - An enumeration calls back once per element and stops at the first call that returns false. TAddToVectorCallback
//   collects everything. The callback may look elements up, but must not add to what is being enumerated.
// - Failure is a thrown TZEPException. A class or property declaration that is not there is kZEPStatusNotFound; anything
//   else that is not there (a qualifier declaration, a qualifier, a property, an instance) comes back as an empty pointer,
//   which the caller tests before use.
// - An operation that the library does not need has a body, so that a plug-in need not write one. It throws
//   kZEPStatusNotImplemented, unless its comment says otherwise. The tool zep and the memory namespace use these, too.
// - Names are compared without regard to case, as CIM names are, and keep the spelling they were made with. What is
//   created or declared under a name that is no CIM name throws kZEPStatusInvalidCIMName.
// - Nothing is promised about threads: one namespace is used from one thread at a time.
class ZEP_EXPORT ICIMElement {
public:
  virtual ~ICIMElement();
};

}  // namespace NQRVZEP20
