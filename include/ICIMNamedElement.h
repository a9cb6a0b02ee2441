#pragma once

#include "ICIMElement.h"
#include "ICIMQualifierDecl.h"

namespace NQRVZEP20 {

class ICIMQualifier;

// A schema element that has a name and may carry qualifiers: a class, property, method or parameter declaration.
class ZEP_EXPORT ICIMNamedElement : public ICIMElement {
public:
  ~ICIMNamedElement() override;

  virtual std::string GetName(TCIMContext const& context) const = 0;

  // The qualifier written on this element itself; empty when there is none, also where a superclass has one.
  virtual boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const& name, TCIMContext const& context) const = 0;

  // The qualifiers written on this element itself, in the order in which they were added.
  virtual void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)> callback,
                                   TCIMContext const& context) const = 0;

  // Writes a qualifier on this element. `declaration` comes from this element's own namespace; the value must be of the
  // declared type (kZEPStatusTypeMismatch). Throws kZEPStatusAlreadyExists when the element has this qualifier.
  virtual boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, TCIMValue const& value,
                                                        unsigned int flavor, TCIMContext const& context) = 0;
};

}  // namespace NQRVZEP20
