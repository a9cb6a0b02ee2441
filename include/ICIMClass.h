// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

class ICIMInstance;
class ICIMMethodDecl;
class ICIMNamespace;
class ICIMProperty;
class ICIMPropertyDecl;

// A CIM class: its name, superclass, qualifiers, property and method declarations, and its instances. Some operations have a
// default body, so that a plug-in may omit them. Unless a comment states otherwise, the default body logs an error and throws
// kZEPStatusNotImplemented. ICIMElement.h lists the operations that each use needs.
class ZEP_EXPORT ICIMClass : public ICIMNamedElement {
public:
  ~ICIMClass() override;

  virtual boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) const = 0;

  // True for an association: the class or one of its superclasses has the qualifier Association. A namespace copy creates
  // associations in a second pass, after every class that they refer to.
  virtual bool GetClassFlag(TCIMContext const& context) const = 0;

  // True when this class itself has the qualifier Abstract: it cannot have instances of its own. Has a default body, which
  // returns false.
  virtual bool IsAbstract(TCIMContext const& context) const;

  virtual bool IsRootClass(TCIMContext const& context) const = 0;                            // it has no superclass
  virtual boost::shared_ptr<ICIMClass> GetSuperClass(TCIMContext const& context) const = 0;  // empty for a root class

  // Visits all direct and indirect subclasses, but not the class itself. A class is visited after its superclass; siblings
  // are visited in the order in which they were created.
  virtual void EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                                   TCIMContext const& context) const = 0;

  // ---- Declaring ----

  // Between these two calls the caller declares the elements of the class. GetPropertyDecl then returns an empty pointer for
  // a name that is not declared yet, instead of throwing. The calls do not nest; EndDeclarations without BeginDeclarations
  // has no effect. Both have a default body, which does nothing.
  virtual void BeginDeclarations(TCIMContext const& context);
  virtual void EndDeclarations(TCIMContext const& context);

  // Declares a property. `defaultValue` determines its type, array bound and referenced class; a NULL `defaultValue` of the
  // intended type means that the property has no default. Throws kZEPStatusAlreadyExists when this class itself declares the
  // name, kZEPStatusTypeMismatch when `defaultValue` has the tag 0, and kZEPStatusInvalidOpSequence after CreateInstance of
  // the class or of a subclass has been called.
  virtual boost::shared_ptr<ICIMPropertyDecl> AddPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                                              TCIMContext const& context) = 0;

  // The declaration of a property in this class or, when this class does not declare it, in the nearest superclass that
  // does. Throws kZEPStatusNotFound when none of them declares it.
  virtual boost::shared_ptr<ICIMPropertyDecl const> GetPropertyDecl(std::string const& name,
                                                                    TCIMContext const& context) const = 0;

  // The declarations of this class itself, without inherited ones, in the order in which they were added.
  virtual void EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                                      TCIMContext const& context) const = 0;

  // ---- Static properties: values that belong to the class ----

  // Sets the static value of a property that this class declares or inherits, for this class only; replaces an earlier value.
  // Throws kZEPStatusNotFound for a name that is not declared and kZEPStatusTypeMismatch for a value of another type. Has a
  // default body.
  virtual void SetStaticProperty(std::string const& name, TCIMValue const& value, TCIMContext const& context);

  // Visits the static properties of this class itself, in the order in which they were first set.
  virtual void EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                         TCIMContext const& context) const = 0;

  // ---- Instances ----

  // Creates an instance whose properties have their default values. Until CommitInstance, only the caller holds it, and
  // enumerations do not visit it. Throws kZEPStatusInvalidClass for an abstract class.
  virtual boost::shared_ptr<ICIMInstance> CreateInstance(TCIMContext const& context) = 0;

  // Visits the instances of this class and then those of its subclasses, class by class in the order of EnumerateSubClasses,
  // and within a class in the order in which they were committed. ICIMInstance::GetClass returns the class of an instance.
  virtual void EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                                  TCIMContext const& context) const = 0;

  // ---- Methods ----

  // Declares a method. Throws kZEPStatusAlreadyExists when this class itself declares the name, and kZEPStatusTypeMismatch
  // for a return type that has no name or is an array. Has a default body.
  virtual boost::shared_ptr<ICIMMethodDecl> AddMethodDecl(std::string const& name, TCIMValue::TCIMType returnType,
                                                          TCIMContext const& context);

  // The declarations of this class itself, without inherited ones, in the order in which they were added.
  virtual void EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                                    TCIMContext const& context) const = 0;

  // ---- Instances again: declared last, because the order of the virtual functions is fixed ----

  // Adds an instance to the instances of this class; from then on its keys cannot be changed. Throws
  // kZEPStatusInvalidInstance for an instance that CreateInstance of this class did not make, and kZEPStatusAlreadyExists
  // when it has already been committed or another instance of the class has the same keys. Instances without keys, or with
  // only NULL keys, are not compared. Has a default body.
  virtual void CommitInstance(boost::shared_ptr<ICIMInstance> instance, TCIMContext const& context);
};

}  // namespace NQRVZEP20
