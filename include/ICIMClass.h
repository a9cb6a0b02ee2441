#pragma once

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

class ICIMInstance;
class ICIMMethodDecl;
class ICIMNamespace;
class ICIMProperty;
class ICIMPropertyDecl;

// A CIM class: its name, superclass, qualifiers, property and method declarations, and its instances. Some operations have a
// body, so that a plug-in may leave them out; where nothing else is said, it throws kZEPStatusNotImplemented. The destination of
// a copy needs them; see ICIMElement.h.
class ZEP_EXPORT ICIMClass : public ICIMNamedElement {
public:
  ~ICIMClass() override;

  virtual boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) const = 0;

  // True for an association: the class or one of its superclasses carries the qualifier Association. A namespace copy
  // makes associations in a second pass, when every class that they refer to is there.
  virtual bool GetClassFlag(TCIMContext const& context) const = 0;

  // True when this class itself carries the qualifier Abstract: it can have no instances of its own. Has a body, which
  // answers false.
  virtual bool IsAbstract(TCIMContext const& context) const;

  virtual bool IsRootClass(TCIMContext const& context) const = 0;                            // it has no superclass
  virtual boost::shared_ptr<ICIMClass> GetSuperClass(TCIMContext const& context) const = 0;  // empty for a root class

  // Every class derived from this one, at any depth, but not the class itself. A class comes after its superclass;
  // siblings come in the order in which they were created.
  virtual void EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                                   TCIMContext const& context) const = 0;

  // ---- Declaring ----

  // Between these two a plug-in knows that the class is still being described: GetPropertyDecl then answers a name that
  // is not declared yet with an empty pointer instead of throwing. Not nested; ending what was not begun does nothing.
  // Both have a body, which does nothing.
  virtual void BeginDeclarations(TCIMContext const& context);
  virtual void EndDeclarations(TCIMContext const& context);

  // Declares a property. The default value, NULL for none, gives its type, array bound and referenced class. Throws
  // kZEPStatusAlreadyExists when this class itself declares the name, kZEPStatusTypeMismatch for a default of tag 0, and
  // kZEPStatusInvalidOpSequence once CreateInstance of the class or of a subclass was called.
  virtual boost::shared_ptr<ICIMPropertyDecl> AddPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                                              TCIMContext const& context) = 0;

  // The declaration of a property in this class or, where it has none, the nearest in its superclasses. Throws
  // kZEPStatusNotFound when there is none at all.
  virtual boost::shared_ptr<ICIMPropertyDecl const> GetPropertyDecl(std::string const& name,
                                                                    TCIMContext const& context) const = 0;

  // The declarations of this class itself, without inherited ones, in the order in which they were added.
  virtual void EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                                      TCIMContext const& context) const = 0;

  // ---- Static properties: values that belong to the class ----

  // Gives a property that this class declares or inherits a value in the class itself, replacing an earlier one. Throws
  // kZEPStatusNotFound for a name that is not declared and kZEPStatusTypeMismatch for a value of another type. Has a body.
  virtual void SetStaticProperty(std::string const& name, TCIMValue const& value, TCIMContext const& context);

  // Those of this class itself, in the order in which they were first set.
  virtual void EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                         TCIMContext const& context) const = 0;

  // ---- Instances ----

  // A new instance with every property at its default. It belongs to nobody but the caller until CommitInstance. Throws
  // kZEPStatusInvalidClass for an abstract class.
  virtual boost::shared_ptr<ICIMInstance> CreateInstance(TCIMContext const& context) = 0;

  // The instances of this class and then those of its subclasses, class by class in the order of EnumerateSubClasses;
  // within a class in the order in which they were committed. ICIMInstance::GetClass tells whose each one is.
  virtual void EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                                  TCIMContext const& context) const = 0;

  // ---- Methods ----

  // Throws kZEPStatusAlreadyExists when this class itself declares the method, kZEPStatusTypeMismatch for a return type
  // without name or an array. Has a body.
  virtual boost::shared_ptr<ICIMMethodDecl> AddMethodDecl(std::string const& name, TCIMValue::TCIMType returnType,
                                                          TCIMContext const& context);

  // The declarations of this class itself, without inherited ones, in the order in which they were added.
  virtual void EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                                    TCIMContext const& context) const = 0;

  // Adds an instance that CreateInstance of this class has made to the class's instances. Throws
  // kZEPStatusInvalidInstance for any other instance, and kZEPStatusAlreadyExists when it is already there or another
  // instance of the class has the same keys (any number may have none, or only NULL ones). From then on its keys cannot be
  // changed. Has a body.
  virtual void CommitInstance(boost::shared_ptr<ICIMInstance> instance, TCIMContext const& context);
};

}  // namespace NQRVZEP20
