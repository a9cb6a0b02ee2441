// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A class and its position in the class tree. Shares ownership of the class with the namespace.
struct TClassEntry {
  boost::shared_ptr<ICIMClass> fClass;
  std::string fName;
  std::string fSuperClass;  // empty for a root class
  bool fIsAbstract;
  bool fIsAssociation;
  bool fIsIndication;  // it or a class above it has the qualifier Indication
  std::size_t fDepth;  // the number of classes above it
};

// Whether the class itself has the qualifier, with a value other than false. Exceptions thrown by the class pass through.
bool HasSetQualifier(ICIMClass const& cls, std::string const& qualifierName);

// All classes of the namespace, each after its superclass. Exceptions thrown by the namespace, which may be of any type
// (FailureOf.h), pass through.
std::vector<TClassEntry> ClassesOf(ICIMNamespace const& ns);

}  // namespace NQRVZEP20
