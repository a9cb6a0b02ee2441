// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMMethodDecl.h"
#include "collect/answer/TReceivedElement.h"
#include "collect/answer/TReceivedParameterDecl.h"

namespace NQRVZEP20 {

// A method of a received namespace.
class TReceivedMethodDecl : public TReceivedElement<ICIMMethodDecl> {
public:
  TReceivedMethodDecl(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TCIMValue::TCIMType returnType,
                      boost::weak_ptr<ICIMNamedElement> owner);

  TCIMValue::TCIMType GetReturnType(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMParameterDecl> AddParameterDecl(std::string const& name, TCIMValue::TCIMType type,
                                                        unsigned int maxArraySize, std::string const& referencedClassName,
                                                        TCIMContext const& context) override;
  void EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)> callback,
                               TCIMContext const& context) const override;
  boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const override;

  // Called only while the namespace is being read.
  void Add(boost::shared_ptr<TReceivedParameterDecl> parameter) { fParameters.push_back(parameter); }

private:
  TCIMValue::TCIMType const fReturnType;
  boost::weak_ptr<ICIMNamedElement> const fOwner;
  std::vector<boost::shared_ptr<TReceivedParameterDecl>> fParameters;
};

}  // namespace NQRVZEP20
