// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"
#include "ZEPExport.h"

#include <boost/function.hpp>
#include <boost/shared_ptr.hpp>
#include <boost/weak_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

// An element that an object path can name: a class or an instance. The base class of ICIMInstance and ICIMNamedElement.
//
// The object model belongs to plug-ins: the library uses classes, instances and qualifiers only through these interfaces and
// stores none of its own. These rules apply to all of the interfaces:
//
// - Objects are passed and held as boost::shared_ptr. A pointer from an element to its namespace or owner is a
//   boost::weak_ptr; making a boost::shared_ptr from one whose target has been destroyed throws boost::bad_weak_ptr.
// - The last argument of every operation is a context: named values that the caller passes to the plug-in, usually none
//   (TCIMContext()). A plug-in ignores unknown entries.
// - An enumeration calls the callback once per element and stops at the first call that returns false. TAddToVectorCallback
//   collects all elements. The callback may look up elements, but must not add elements of the kind that is being enumerated.
// - An operation that fails throws TZEPException. A lookup of a missing class or property declaration throws
//   kZEPStatusNotFound. A lookup of any other missing element (a qualifier declaration, a qualifier, a property, an instance)
//   returns an empty pointer, which the caller must check.
// - An operation that only some uses need has a default body, so that other plug-ins need not implement it. Unless its
//   comment states otherwise, the default body logs one error that names the plug-in's class and the operation, and throws
//   kZEPStatusNotImplemented. These uses need operations that have such a body:
//
//     source of a copy (TCIMCopy)   ICIMProperty::GetDeclaration, if a class has static properties; ICIMInstance::GetClass and
//                                   ICIMProperty::GetName, if instances are copied
//     destination of a copy         CreateQualifierDecl, AddQualifier, SetStaticProperty and AddMethodDecl, if the source has
//                                   such elements; CommitInstance, if instances are copied
//     queries (TCIMSchemaHelper)    none
//     references (TCIMReference)    none
//     the tool zep                  ICIMNamespace::GetName, ICIMInstance::GetPath, ICIMProperty::GetName and GetDeclaration,
//                                   ICIMPropertyDecl::IsKey
//
//   docs/writing-a-provider.md has the complete table, including the operations without a body.
// - Names are compared case-insensitively, like all CIM names, and keep the spelling with which they were created. Creating
//   or declaring an element with a name that is not a valid CIM name throws kZEPStatusInvalidCIMName.
// - Plug-ins need not be thread-safe: use a namespace and its elements from one thread at a time.
class ZEP_EXPORT ICIMElement {
public:
  virtual ~ICIMElement();
};

}  // namespace NQRVZEP20
