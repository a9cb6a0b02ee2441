// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMElement.h"

namespace NQRVZEP20 {

class ICIMPropertyDecl;

// The value of one property: of an instance, or of a class itself (a static property).
class ZEP_EXPORT ICIMProperty {
public:
  virtual ~ICIMProperty();

  virtual TCIMValue GetValue(TCIMContext const& context) const = 0;

  // Throws kZEPStatusTypeMismatch when the type of the value, which may be NULL, is not the declared type, and
  // kZEPStatusInvalidOpSequence for a key of an instance that has been committed.
  virtual void SetValue(TCIMValue const& value, TCIMContext const& context) = 0;

  // Both have a default body, which logs an error and throws kZEPStatusNotImplemented. Copying an instance needs GetName,
  // copying a static property needs GetDeclaration.
  virtual std::string GetName(TCIMContext const& context) const;  // spelled as declared
  virtual boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
