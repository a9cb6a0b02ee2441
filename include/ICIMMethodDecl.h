// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

class ICIMParameterDecl;

// The declaration of a method in a class: a name, a return type and parameters. Methods cannot be called through this
// interface.
class ZEP_EXPORT ICIMMethodDecl : public ICIMNamedElement {
public:
  ~ICIMMethodDecl() override;

  virtual TCIMValue::TCIMType GetReturnType(TCIMContext const& context) const = 0;  // never an array

  // Adds a parameter after the existing ones. `referencedClassName` must be empty unless the type is a reference or an array
  // of references, and `maxArraySize` must be 0 unless the type is an array. Otherwise throws kZEPStatusNotReference or
  // kZEPStatusNotArray. Throws kZEPStatusAlreadyExists when the method already has a parameter of that name, and
  // kZEPStatusTypeMismatch for a type that has no name.
  virtual boost::shared_ptr<ICIMParameterDecl> AddParameterDecl(std::string const& name, TCIMValue::TCIMType type,
                                                                unsigned int maxArraySize, std::string const& referencedClassName,
                                                                TCIMContext const& context) = 0;

  // Visits the parameters in the order in which they were added.
  virtual void EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)> callback,
                                       TCIMContext const& context) const = 0;

  // The class that declares the method. Has a default body, which returns an empty pointer.
  virtual boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
