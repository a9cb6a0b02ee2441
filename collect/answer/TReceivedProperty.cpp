// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedProperty.h"

#include "TZEPException.h"
#include "collect/answer/TReceivedNamespace.h"

#include <utility>

namespace NQRVZEP20 {

TReceivedProperty::TReceivedProperty(boost::weak_ptr<TReceivedNamespace> ns, std::string name,
                                     boost::shared_ptr<ICIMPropertyDecl const> declaration, std::size_t at)
    : fNamespace(std::move(ns)), fName(std::move(name)), fDeclaration(std::move(declaration)), fAt(at) {}

TCIMValue TReceivedProperty::GetValue(TCIMContext const&) const {
  return boost::shared_ptr<TReceivedNamespace>(fNamespace)->ValueAt(fAt);
}

void TReceivedProperty::SetValue(TCIMValue const&, TCIMContext const&) { RefuseChange(); }

std::string TReceivedProperty::GetName(TCIMContext const&) const { return fName; }

boost::shared_ptr<ICIMPropertyDecl const> TReceivedProperty::GetDeclaration(TCIMContext const&) const {
  if (!fDeclaration) throw TZEPException(kZEPStatusNotFound);
  return fDeclaration;
}

}  // namespace NQRVZEP20
