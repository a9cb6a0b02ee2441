#pragma once

#include "ICIMElement.h"

namespace NQRVZEP20 {

class ICIMPropertyDecl;

// One property value: of an instance, or of a class itself (a static property).
class ZEP_EXPORT ICIMProperty {
public:
  virtual ~ICIMProperty();

  virtual TCIMValue GetValue(TCIMContext const& context) const = 0;

  // Throws kZEPStatusTypeMismatch when the value's type, NULL or not, is not the declared one, and
  // kZEPStatusInvalidOpSequence for a key of an instance that was committed.
  virtual void SetValue(TCIMValue const& value, TCIMContext const& context) = 0;

  // Both have a body, which throws kZEPStatusNotImplemented: copying an instance needs the first, copying a static property
  // the second.
  virtual std::string GetName(TCIMContext const& context) const;  // spelled as declared
  virtual boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
