// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMParameterDecl.h"
#include "TMemoryNamedElement.h"

namespace NQRVZEP20 {

// A parameter declaration. Created by TMemoryMethodDecl.
class TMemoryParameterDecl : public TMemoryNamedElement<ICIMParameterDecl> {
public:
  TMemoryParameterDecl(std::string const& name, TCIMValue::TCIMType type, unsigned int maxArraySize,
                       std::string const& referencedClassName, boost::weak_ptr<ICIMMethodDecl> method,
                       boost::weak_ptr<ICIMNamespace> ns);

  TCIMValue::TCIMType GetType(TCIMContext const& context) const override;
  unsigned int GetMaxArraySize(TCIMContext const& context) const override;
  std::string GetReferencedClassName(TCIMContext const& context) const override;
  boost::weak_ptr<ICIMMethodDecl> GetMethod(TCIMContext const& context) const override;

private:
  TCIMValue::TCIMType fType;
  unsigned int fMaxArraySize;
  std::string fReferencedClassName;
  boost::weak_ptr<ICIMMethodDecl> fMethod;
};

}  // namespace NQRVZEP20
