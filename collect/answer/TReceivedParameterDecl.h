// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMParameterDecl.h"
#include "collect/answer/TReceivedElement.h"

namespace NQRVZEP20 {

// A method parameter of a received namespace.
class TReceivedParameterDecl : public TReceivedElement<ICIMParameterDecl> {
public:
  struct TFacts {
    TCIMValue::TCIMType fType = TCIMValue::TCIMType::kCIMTypeInvalid;
    unsigned int fMaxArraySize = 0;
    std::string fReferencedClassName;
    boost::weak_ptr<ICIMMethodDecl> fMethod;
  };

  TReceivedParameterDecl(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TFacts facts);

  TCIMValue::TCIMType GetType(TCIMContext const& context) const override;
  unsigned int GetMaxArraySize(TCIMContext const& context) const override;
  std::string GetReferencedClassName(TCIMContext const& context) const override;
  boost::weak_ptr<ICIMMethodDecl> GetMethod(TCIMContext const& context) const override;

private:
  TFacts const fFacts;
};

}  // namespace NQRVZEP20
