// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMElement.h"
#include "TCIMReference.h"

namespace NQRVZEP20 {

class ICIMClass;
class ICIMInstance;
class ICIMQualifierDecl;

// One CIM namespace: qualifier declarations, classes and their instances.
class ZEP_EXPORT ICIMNamespace {
public:
  virtual ~ICIMNamespace();

  // Such as "root/cimv2". Has a default body, which logs an error and throws kZEPStatusNotImplemented.
  virtual std::string GetName(TCIMContext const& context) const;

  // Creates a class derived from `superClass`, or a root class when `superClass` is empty. Throws kZEPStatusInvalidClass when
  // `superClass` belongs to another namespace, and kZEPStatusAlreadyExists when a class of that name exists.
  virtual boost::shared_ptr<ICIMClass> CreateClass(boost::shared_ptr<ICIMClass> superClass, std::string const& name,
                                                   TCIMContext const& context) = 0;

  // Throws kZEPStatusNotFound when the namespace has no class with that name.
  virtual boost::shared_ptr<ICIMClass> GetClass(std::string const& className, TCIMContext const& context) const = 0;

  // Visits the root classes, in the order in which they were created. ICIMClass::EnumerateSubClasses of each root class
  // visits the classes below it. Together the two enumerations visit every class of the namespace once, superclasses first.
  virtual void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                                TCIMContext const& context) const = 0;

  // ---- Qualifier declarations ----

  // Declares a qualifier. `defaultValue` determines its type and array bound; a NULL `defaultValue` of the intended type
  // means that there is no default. `scope` and `flavor` are sets of ICIMQualifierDecl::EScope and EFlavor. Throws
  // kZEPStatusAlreadyExists when the name is already declared, and kZEPStatusTypeMismatch for a type that no qualifier can
  // have (tag 0, references). Has a default body, which logs an error and throws kZEPStatusNotImplemented: only the
  // destination of a namespace copy needs this operation.
  virtual boost::shared_ptr<ICIMQualifierDecl> CreateQualifierDecl(std::string const& name, TCIMValue const& defaultValue,
                                                                   unsigned int scope, unsigned int flavor,
                                                                   TCIMContext const& context);

  // The returned pointer is empty when the name is not declared.
  virtual boost::shared_ptr<ICIMQualifierDecl> GetQualifierDecl(std::string const& name, TCIMContext const& context) const = 0;

  // Visits the declarations in the order in which they were created.
  virtual void EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)> callback,
                                       TCIMContext const& context) const = 0;

  // ---- Instances ----

  // Returns the committed instance that the path names: an instance of exactly the path's class, not of a subclass, with
  // exactly the path's keys. The returned pointer is empty when there is none.
  virtual boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const& path, TCIMContext const& context) const = 0;
};

}  // namespace NQRVZEP20
