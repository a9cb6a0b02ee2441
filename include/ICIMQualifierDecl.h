#pragma once

#include "ICIMElement.h"

namespace NQRVZEP20 {

// A qualifier declaration of a namespace: what a qualifier of this name means wherever it is written.
class ZEP_EXPORT ICIMQualifierDecl {
public:
  // Where the qualifier may be written; a set of these.
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

  // How a qualifier passes on to subclasses; a set of these. None set: restricted, with overriding disabled.
  enum EFlavor : unsigned int {
    kFlavorEnableOverride = 0x01,  // a subclass may give it another value
    kFlavorToSubclass = 0x02,      // it is handed down; without this it is restricted to its own element
    kFlavorTranslatable = 0x04,
    kFlavorDefault = kFlavorEnableOverride | kFlavorToSubclass
  };

  virtual ~ICIMQualifierDecl();

  virtual std::string GetName(TCIMContext const& context) const = 0;
  virtual TCIMValue::TCIMType GetType(TCIMContext const& context) const = 0;
  virtual unsigned int GetScope(TCIMContext const& context) const = 0;   // a set of EScope
  virtual unsigned int GetFlavor(TCIMContext const& context) const = 0;  // a set of EFlavor

  // The value where a qualifier is written without one. NULL when there is none; always of the declared type, and with
  // the declared array bound.
  virtual TCIMValue GetDefaultValue(TCIMContext const& context) const = 0;
};

}  // namespace NQRVZEP20
