#pragma once

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

class ICIMParameterDecl;

// The declaration of a method in a class: a name, a return type and parameters. Methods are described, not called.
class ZEP_EXPORT ICIMMethodDecl : public ICIMNamedElement {
public:
  ~ICIMMethodDecl() override;

  virtual TCIMValue::TCIMType GetReturnType(TCIMContext const& context) const = 0;  // never an array

  // Adds a parameter behind the others. `referencedClassName` is empty unless the type is a reference or an array of
  // references (kZEPStatusNotReference), `maxArraySize` is 0 unless it is an array (kZEPStatusNotArray). Throws
  // kZEPStatusAlreadyExists when the method has a parameter of that name, kZEPStatusTypeMismatch for a type without name.
  virtual boost::shared_ptr<ICIMParameterDecl> AddParameterDecl(std::string const& name, TCIMValue::TCIMType type,
                                                                unsigned int maxArraySize, std::string const& referencedClassName,
                                                                TCIMContext const& context) = 0;

  // In the order in which they were added.
  virtual void EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)> callback,
                                       TCIMContext const& context) const = 0;

  // The class that declares it. Has a body, which answers with an empty pointer.
  virtual boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
