#pragma once

#include "ICIMElement.h"
#include "ICIMQualifierDecl.h"

namespace NQRVZEP20 {

class ICIMQualifier;

// A schema element that has a name and may carry qualifiers: a class, property, method or parameter declaration. Where
// these interfaces ask whether an element carries a qualifier, one with the boolean value false counts for nothing.
class ZEP_EXPORT ICIMNamedElement : public ICIMElement {
public:
  ~ICIMNamedElement() override;

  virtual std::string GetName(TCIMContext const& context) const = 0;

  // The qualifier written on this element itself; empty when there is none, also where a superclass has one.
  virtual boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const& name, TCIMContext const& context) const = 0;

  // The qualifiers written on this element itself, in the order in which they were added.
  virtual void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)> callback,
                                   TCIMContext const& context) const = 0;

  // Writes a qualifier on this element. `declaration` is one of this element's own namespace (kZEPStatusNotFound, as for an
  // empty one); the value must be of the declared type (kZEPStatusTypeMismatch). Throws kZEPStatusAlreadyExists when the element
  // has it, kZEPStatusInvalidOpSequence for Key on a property of a class that has made instances. Whether the qualifier may
  // stand on this kind of element is not checked. Has a body, which throws kZEPStatusNotImplemented: the
  // destination of a copy needs it.
  virtual boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, TCIMValue const& value,
                                                        unsigned int flavor, TCIMContext const& context);
};

}  // namespace NQRVZEP20
