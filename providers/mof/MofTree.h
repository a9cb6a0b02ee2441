// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"
#include "providers/mof/TMofError.h"

#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A MOF text as it is written: what the parser makes and the builder declares. Names are parts of the files, which the
// document owns. Classes and instances, of which there may be very many, are not kept: the document knows where each stands,
// and they are read again when they are declared, one after another.

struct TMofLiteral {
  enum EKind { kNull, kBoolean, kNumber, kString, kChar, kAlias };

  EKind fKind;
  TMofPlace fPlace;
  std::string fString;  // of kString: joined, without quotes and escapes
};

struct TMofValue {
  TMofPlace fPlace;
  bool fIsArray = false;
  std::vector<TMofLiteral> fLiterals;  // one unless it is an array
};

struct TMofQualifier {
  TMofPlace fName;
  std::optional<TMofValue> fValue;
  std::optional<unsigned int> fFlavor;
};

using TMofQualifiers = std::vector<TMofQualifier>;

// A type with the array mark that stands behind the name of what has it.
struct TMofType {
  TCIMValue::TCIMType fType = TCIMValue::TCIMType::kCIMTypeInvalid;  // with the array flag
  unsigned int fMaxArraySize = 0;
  TMofPlace fReferencedClass;  // of references
};

struct TMofQualifierDecl {
  TMofPlace fName;
  TMofType fType;
  std::optional<TMofValue> fValue;
  unsigned int fScope = 0;
  unsigned int fFlavor = 0;
};

struct TMofParameter {
  TMofQualifiers fQualifiers;
  TMofType fType;
  TMofPlace fName;
};

// A property, or a method when it has parentheses.
struct TMofFeature : TMofParameter {
  std::optional<TMofValue> fDefault;
  bool fIsMethod = false;
  std::vector<TMofParameter> fParameters;
};

struct TMofClass {
  TMofQualifiers fQualifiers;
  TMofPlace fName;
  TMofPlace fSuperClass;  // empty text when there is none
  std::vector<TMofFeature> fFeatures;
};

struct TMofAssignment {
  TMofPlace fName;
  TMofValue fValue;
};

struct TMofInstance {
  TMofPlace fClassName;
  TMofPlace fAlias;  // empty text when there is none
  std::vector<TMofAssignment> fValues;
};

// Where a class stands.
struct TMofClassText {
  TMofFile const* fFile;
  char const* fStart;    // of its qualifiers
  char const* fKeyword;  // "class"
};

// Where an instance stands.
struct TMofInstanceText {
  TMofFile const* fFile;
  char const* fKeyword;  // "instance"
};

// The form of everything in it is right.
struct TMofDocument {
  std::vector<std::unique_ptr<TMofFile>> fFiles;
  std::vector<TMofQualifierDecl> fQualifierDecls;
  std::deque<TMofClassText> fClasses;
  std::deque<TMofInstanceText> fInstances;
};

}  // namespace NQRVZEP20
