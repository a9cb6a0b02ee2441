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

// The syntax tree of MOF, which the parser creates and the builder declares. Names are views into the files, which the document
// owns. The trees of classes and instances are not kept, because there may be very many: the document stores their positions,
// and each is parsed again when it is declared.

struct TMofLiteral {
  enum EKind { kNull, kBoolean, kNumber, kString, kChar, kAlias };

  EKind fKind;
  TMofSpan fSpan;
  std::string fString;  // of kString: joined, without quotes and escapes
};

struct TMofValue {
  TMofSpan fSpan;
  bool fIsArray = false;
  std::vector<TMofLiteral> fLiterals;  // one unless it is an array
};

struct TMofQualifier {
  TMofSpan fName;
  std::optional<TMofValue> fValue;
  std::optional<unsigned int> fFlavor;
};

using TMofQualifiers = std::vector<TMofQualifier>;

// A type, with the array mark that follows the name of the element.
struct TMofType {
  TCIMValue::TCIMType fType = TCIMValue::TCIMType::kCIMTypeInvalid;  // with the array flag
  unsigned int fMaxArraySize = 0;
  TMofSpan fReferencedClass;  // of references
};

struct TMofQualifierDecl {
  TMofSpan fName;
  TMofType fType;
  std::optional<TMofValue> fValue;
  unsigned int fScope = 0;
  unsigned int fFlavor = 0;
};

struct TMofParameter {
  TMofQualifiers fQualifiers;
  TMofType fType;
  TMofSpan fName;
};

// A property, or a method when it has parentheses.
struct TMofFeature : TMofParameter {
  std::optional<TMofValue> fDefault;
  bool fIsMethod = false;
  std::vector<TMofParameter> fParameters;
};

struct TMofClass {
  TMofQualifiers fQualifiers;
  TMofSpan fName;
  TMofSpan fSuperClass;  // its fText is empty if there is none
  std::vector<TMofFeature> fFeatures;
};

struct TMofAssignment {
  TMofSpan fName;
  TMofValue fValue;
};

struct TMofInstance {
  TMofSpan fClassName;
  TMofSpan fAlias;  // its fText is empty if there is none
  std::vector<TMofAssignment> fValues;
};

// The position of a class.
struct TMofClassText {
  TMofFile const* fFile;
  char const* fStart;    // of its qualifiers
  char const* fKeyword;  // "class"
};

// The position of an instance.
struct TMofInstanceText {
  TMofFile const* fFile;
  char const* fKeyword;  // "instance"
};

// The syntax of everything in it has been checked.
struct TMofDocument {
  std::vector<std::unique_ptr<TMofFile>> fFiles;
  std::vector<TMofQualifierDecl> fQualifierDecls;
  std::deque<TMofClassText> fClasses;
  std::deque<TMofInstanceText> fInstances;
};

}  // namespace NQRVZEP20
