// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// A class and its place in the tree. It shares the class with the namespace.
struct TClassEntry {
  boost::shared_ptr<ICIMClass> fClass;
  std::string fName;
  std::string fSuperClass;  // empty for a root class
  bool fIsAbstract;
  bool fIsAssociation;
  bool fIsIndication;  // it or a class above it has the qualifier Indication
  std::size_t fDepth;  // the number of classes above it
};

// Whether the class itself has the qualifier, with a value other than false. Passes on what the class throws.
bool HasSetQualifier(ICIMClass const& cls, std::string const& qualifierName);

// Every class of the namespace, each after its superclass. Passes on what the namespace throws, which may be of any type
// (FailureOf.h).
std::vector<TClassEntry> ClassesOf(ICIMNamespace const& ns);

}  // namespace NQRVZEP20
