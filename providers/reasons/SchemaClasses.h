// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// A class of the DMTF schema 2.49.0.
struct TSchemaClass {
  enum EKind { kConcrete, kAbstract, kAssociation, kAbstractAssociation };

  char const* fName;
  char const* fSuperClass;  // empty for a root class
  EKind fKind;

  bool IsAbstract() const { return fKind == kAbstract || fKind == kAbstractAssociation; }
  bool IsAssociation() const { return fKind == kAssociation || fKind == kAbstractAssociation; }
};

// Null if the table does not contain the class. It contains the classes that providers for a server commonly use and all their
// superclasses. Case matters.
TSchemaClass const* FindSchemaClass(std::string const& name);

// The complete table, in byte order of the names.
TSchemaClass const* BeginOfSchemaClasses();
TSchemaClass const* EndOfSchemaClasses();

}  // namespace NQRVZEP20
