// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMClass.h"
#include "TCIMValue.h"
#include "collect/TNamespaceView.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// A finding or a note: its place, the matter, and the remedy.
struct TIssue {
  std::string fPlace;   // such as a class, the path of an instance, or a property
  std::string fText;    // one sentence, without a full stop
  std::string fRemedy;  // may be empty
};

struct TDeclaration {
  std::string fName;
  TCIMValue::TCIMType fType;
  bool fIsKey;
};

// The default value of a declaration, or the value of a static property or of a qualifier.
struct TDeclaredValue {
  std::string fPlace;  // such as "X_Disk.Size, default value" or "X_Disk, qualifier Description"
  TCIMValue fValue;
};

struct TClassContent {
  std::string fName;
  std::vector<std::string> fSuperClasses;   // the nearest first
  std::vector<TDeclaration> fDeclarations;  // with those of the superclasses; of several of a name, only the nearest
  bool fIsAbstract;
  std::vector<TDeclaredValue> fDeclaredValues;  // of the class, its properties, methods and parameters, without superclasses
};

// The declaration of that name, in any case; null if there is none.
TDeclaration const* FindDeclaration(TClassContent const& cls, std::string const& name);

struct TPropertyContent {
  std::string fName;
  TCIMValue fValue;
  bool fIsKey;
};

struct TInstanceContent {
  std::string fClass;
  std::string fPath;  // as zep prints it (TNamespaceView::PathOf)
  bool fHasKeys;      // whether a key has a value
  std::vector<TPropertyContent> fProperties;
};

// All that a namespace contains, as a plain value.
struct TContent {
  std::string fProvider, fNamespace;
  std::vector<TClassContent> fClasses;
  std::vector<TInstanceContent> fInstances;
  std::vector<TIssue> fFailures;  // operations that failed; the elements that they concern are left out above
};

// Throws what the class throws.
TClassContent ContentOf(ICIMClass const& cls);

// Failures of the namespace are in the result.
TContent ContentOf(TNamespaceView const& view);

}  // namespace NQRVZEP20::zep
