// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMElement.h"

namespace NQRVZEP20 {

class ICIMNamedElement;
class ICIMQualifierDecl;

// A qualifier of one element: a name, a value and a flavor.
class ZEP_EXPORT ICIMQualifier {
public:
  virtual ~ICIMQualifier();

  virtual std::string GetName(TCIMContext const& context) const = 0;  // spelled as declared
  virtual TCIMValue GetValue(TCIMContext const& context) const = 0;
  virtual unsigned int GetFlavor(TCIMContext const& context) const = 0;  // a set of ICIMQualifierDecl::EFlavor

  // Has a default body, which logs an error and throws kZEPStatusNotImplemented.
  virtual boost::shared_ptr<ICIMQualifierDecl> GetDeclaration(TCIMContext const& context) const;

  // The element that has the qualifier. Has a default body, which returns an empty pointer.
  virtual boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
