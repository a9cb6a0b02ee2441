// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

struct TClassEntry {
  boost::shared_ptr<ICIMClass> fClass;
  std::string fName;
  std::string fSuperClass;  // empty for a root class
  bool fIsAbstract;
  bool fIsAssociation;
  bool fIsIndication;
  std::size_t fDepth;  // how many classes are above it
};

// Whether the class itself carries the qualifier, with any value but false.
bool IsSet(ICIMClass const& cls, std::string const& qualifierName);

// Every class of the namespace, each below its superclass.
std::vector<TClassEntry> ClassesOf(ICIMNamespace const& ns);

}  // namespace NQRVZEP20::zep
