// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

// The declaration of a property in a class. Its type, array bound and referenced class are those of its default value. If a
// property has no default, its default value is a NULL with that type, array bound and referenced class.
class ZEP_EXPORT ICIMPropertyDecl : public ICIMNamedElement {
public:
  ~ICIMPropertyDecl() override;

  virtual TCIMValue::TCIMType GetType(TCIMContext const& context) const = 0;
  virtual TCIMValue GetDefaultValue(TCIMContext const& context) const = 0;

  // True when the property is a key: it has the qualifier Key, or overrides a property that is a key. Has a default body,
  // which logs an error and throws kZEPStatusNotImplemented.
  virtual bool IsKey(TCIMContext const& context) const;

  // The class that declares the property. Has a default body, which returns an empty pointer.
  virtual boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
