// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMElement.h"
#include "ICIMQualifierDecl.h"

namespace NQRVZEP20 {

class ICIMQualifier;

// A schema element that has a name and may have qualifiers: a class, property, method or parameter declaration. Where a
// rule of these interfaces depends on a qualifier, such as Key, Abstract or Association, a qualifier with the value false is
// treated as missing.
class ZEP_EXPORT ICIMNamedElement : public ICIMElement {
public:
  ~ICIMNamedElement() override;

  virtual std::string GetName(TCIMContext const& context) const = 0;

  // Returns the qualifier of this element itself, or an empty pointer if it has none, even if the corresponding element of a
  // superclass has one.
  virtual boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const& name, TCIMContext const& context) const = 0;

  // Visits the qualifiers of this element itself, in the order in which they were added.
  virtual void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)> callback,
                                   TCIMContext const& context) const = 0;

  // Adds a qualifier to this element. Throws kZEPStatusNotFound when `declaration` is empty or belongs to another namespace,
  // kZEPStatusTypeMismatch when the value is not of the declared type, kZEPStatusAlreadyExists when the element already has
  // the qualifier, and kZEPStatusInvalidOpSequence for Key on a property of a class that has already created instances. The
  // scope of the declaration is not checked against the kind of element. Has a default body, which logs an error and throws
  // kZEPStatusNotImplemented; the destination of a copy needs this operation.
  virtual boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, TCIMValue const& value,
                                                        unsigned int flavor, TCIMContext const& context);
};

}  // namespace NQRVZEP20
