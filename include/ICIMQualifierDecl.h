// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMElement.h"

namespace NQRVZEP20 {

// A qualifier declaration of a namespace. It determines the type, scope, flavor and default value of the qualifiers with its
// name.
class ZEP_EXPORT ICIMQualifierDecl {
public:
  // The kinds of element that may have the qualifier. Values are combined with |.
  enum EScope : unsigned int {
    kScopeClass = 0x01,
    kScopeAssociation = 0x02,
    kScopeIndication = 0x04,
    kScopeProperty = 0x08,
    kScopeReference = 0x10,
    kScopeMethod = 0x20,
    kScopeParameter = 0x40,
    kScopeAny = 0x7f
  };

  // How subclasses inherit the qualifier. Values are combined with |; 0 means restricted, with overriding disabled.
  enum EFlavor : unsigned int {
    kFlavorEnableOverride = 0x01,  // a subclass may give the qualifier another value
    kFlavorToSubclass = 0x02,      // subclasses inherit it; without this flag it applies to its own element only
    kFlavorTranslatable = 0x04,    // the value may be translated into other languages
    kFlavorDefault = kFlavorEnableOverride | kFlavorToSubclass
  };

  virtual ~ICIMQualifierDecl();

  virtual std::string GetName(TCIMContext const& context) const = 0;
  virtual TCIMValue::TCIMType GetType(TCIMContext const& context) const = 0;
  virtual unsigned int GetScope(TCIMContext const& context) const = 0;   // a set of EScope
  virtual unsigned int GetFlavor(TCIMContext const& context) const = 0;  // a set of EFlavor

  // The value of a qualifier that is written without a value. NULL when there is no default. It always has the declared type
  // and array bound.
  virtual TCIMValue GetDefaultValue(TCIMContext const& context) const = 0;
};

}  // namespace NQRVZEP20
