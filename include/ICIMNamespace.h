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

  virtual std::string GetName(TCIMContext const& context) const;  // such as "root/cimv2"; has a body

  // Creates a class under `superClass`, which is of this namespace (kZEPStatusInvalidClass) or empty for a root class.
  // Throws kZEPStatusAlreadyExists when there is a class of that name.
  virtual boost::shared_ptr<ICIMClass> CreateClass(boost::shared_ptr<ICIMClass> superClass, std::string const& name,
                                                   TCIMContext const& context) = 0;

  virtual boost::shared_ptr<ICIMClass> GetClass(std::string const& className, TCIMContext const& context) const = 0;

  // The root classes, in the order in which they were created. Each of them leads to the classes below it
  // (ICIMClass::EnumerateSubClasses), so that the two together visit every class of the namespace once, superclasses
  // first.
  virtual void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                                TCIMContext const& context) const = 0;

  // ---- Qualifier declarations ----

  // The default value, NULL for none, gives type and array bound. `scope` and `flavor` are sets of
  // ICIMQualifierDecl::EScope and EFlavor. Throws kZEPStatusAlreadyExists when the name is declared, and
  // kZEPStatusTypeMismatch for a type that no qualifier can have (tag 0, references). Has a body: only the destination of
  // a namespace copy needs it.
  virtual boost::shared_ptr<ICIMQualifierDecl> CreateQualifierDecl(std::string const& name, TCIMValue const& defaultValue,
                                                                   unsigned int scope, unsigned int flavor,
                                                                   TCIMContext const& context);

  // Empty when the name is not declared.
  virtual boost::shared_ptr<ICIMQualifierDecl> GetQualifierDecl(std::string const& name, TCIMContext const& context) const = 0;

  // In the order in which they were created.
  virtual void EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)> callback,
                                       TCIMContext const& context) const = 0;

  // ---- Instances ----

  // The committed instance that the path names: of that very class (an instance of a subclass goes by its own class) and
  // with exactly these keys. Empty when there is none.
  virtual boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const& path, TCIMContext const& context) const = 0;
};

}  // namespace NQRVZEP20
