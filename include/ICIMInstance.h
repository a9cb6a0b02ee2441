#pragma once

#include "ICIMElement.h"
#include "TCIMReference.h"

namespace NQRVZEP20 {

class ICIMClass;
class ICIMProperty;

// One instance of a class: a property value for each property that its class declares or inherits.
class ZEP_EXPORT ICIMInstance : public ICIMElement {
public:
  ~ICIMInstance() override;

  // The class that the instance was created in. Has a body, which throws kZEPStatusNotImplemented, as that of GetPath does:
  // copying an instance needs it.
  virtual boost::shared_ptr<ICIMClass> GetClass(TCIMContext const& context) const;

  // Empty when the class has no such property.
  virtual boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const = 0;

  // Those of the topmost superclass first, then downwards; each class's in the order of declaration. A property that a
  // subclass overrides is visited once, in the place of the first declaration.
  virtual void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                   TCIMContext const& context) const = 0;

  // The object path: the class and the values of its key properties. A key whose value is NULL is left out. Has a body.
  virtual TCIMReference GetPath(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
