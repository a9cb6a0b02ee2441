// SPDX-License-Identifier: Apache-2.0
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

  // The class whose CreateInstance made the instance. Has a default body, which logs an error and throws
  // kZEPStatusNotImplemented; copying an instance needs this operation.
  virtual boost::shared_ptr<ICIMClass> GetClass(TCIMContext const& context) const;

  // The returned pointer is empty when the class has no such property.
  virtual boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const = 0;

  // Visits the properties of the topmost superclass first, then those of each class below it, in the order of declaration
  // within a class. A property that a subclass overrides is visited once, at the position of its first declaration.
  virtual void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                   TCIMContext const& context) const = 0;

  // The object path: the class and the values of its key properties. A key whose value is NULL is left out. Has a default
  // body, which logs an error and throws kZEPStatusNotImplemented.
  virtual TCIMReference GetPath(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
