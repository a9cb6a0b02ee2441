#pragma once

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

// The declaration of a property in a class. Type, array bound and referenced class are those of its default value, which
// is NULL where the property has no default: a NULL value carries all three.
class ZEP_EXPORT ICIMPropertyDecl : public ICIMNamedElement {
public:
  ~ICIMPropertyDecl() override;

  virtual TCIMValue::TCIMType GetType(TCIMContext const& context) const = 0;
  virtual TCIMValue GetDefaultValue(TCIMContext const& context) const = 0;

  // True when the property identifies instances: it carries the qualifier Key, or overrides a property that does. Has a
  // body.
  virtual bool IsKey(TCIMContext const& context) const;

  // The class that declares it. Has a body, which answers with an empty pointer.
  virtual boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
