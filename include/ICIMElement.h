// SPDX-License-Identifier: Apache-2.0
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
// - An operation that only some uses need has a body, so that a plug-in which is not used in that way need not write it.
//   Unless its comment says otherwise, the body logs one error that names the plug-in's class and the operation, and throws
//   kZEPStatusNotImplemented. Which of them a use needs:
//
//     a copy's source (TCIMCopy)    GetDeclaration of a property, when a class has static properties; GetClass of an instance
//                                   and GetName of a property, when instances are copied
//     a copy's destination          CreateQualifierDecl, AddQualifier, SetStaticProperty and AddMethodDecl, when the source
//                                   has such; CommitInstance, when instances are copied
//     queries (TCIMSchemaHelper)    none
//     references (TCIMReference)    none
//     the tool zep                  GetName of a namespace, GetPath, GetName and GetDeclaration of a property, IsKey
//
//   docs/writing-a-provider.md has the whole table, of the operations without a body too.
// - Names are compared without regard to case, as CIM names are, and keep the spelling they were made with. What is
//   created or declared under a name that is no CIM name throws kZEPStatusInvalidCIMName.
// - Nothing is promised about threads: one namespace is used from one thread at a time.
class ZEP_EXPORT ICIMElement {
public:
  virtual ~ICIMElement();
};

}  // namespace NQRVZEP20
