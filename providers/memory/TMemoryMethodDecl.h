// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMMethodDecl.h"
#include "TMemoryNamedElement.h"
#include "TMemoryParameterDecl.h"

namespace NQRVZEP20 {

// A method declaration. Created by TMemoryClass.
class TMemoryMethodDecl : public TMemoryNamedElement<ICIMMethodDecl> {
public:
  TMemoryMethodDecl(std::string const& name, TCIMValue::TCIMType returnType, boost::weak_ptr<ICIMNamedElement> owner,
                    boost::weak_ptr<ICIMNamespace> ns);

  TCIMValue::TCIMType GetReturnType(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMParameterDecl> AddParameterDecl(std::string const& name, TCIMValue::TCIMType type,
                                                        unsigned int maxArraySize, std::string const& referencedClassName,
                                                        TCIMContext const& context) override;
  void EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)> callback,
                               TCIMContext const& context) const override;
  boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const override;

private:
  TCIMValue::TCIMType fReturnType;
  boost::weak_ptr<ICIMNamedElement> fOwner;
  TNamedList<TMemoryParameterDecl> fParameterDecls;
};

}  // namespace NQRVZEP20
