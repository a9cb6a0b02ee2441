// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedMethodDecl.h"

namespace NQRVZEP20 {

TReceivedMethodDecl::TReceivedMethodDecl(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TCIMValue::TCIMType returnType,
                                         boost::weak_ptr<ICIMNamedElement> owner)
    : TReceivedElement(ns, std::move(name)), fReturnType(returnType), fOwner(owner) {}

TCIMValue::TCIMType TReceivedMethodDecl::GetReturnType(TCIMContext const&) const { return fReturnType; }

boost::shared_ptr<ICIMParameterDecl> TReceivedMethodDecl::AddParameterDecl(std::string const&, TCIMValue::TCIMType, unsigned int,
                                                                           std::string const&, TCIMContext const&) {
  RefuseChange();
}

void TReceivedMethodDecl::EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)> callback,
                                                  TCIMContext const&) const {
  for (auto const& parameter : fParameters)
    if (!callback(parameter)) return;
}

boost::weak_ptr<ICIMNamedElement> TReceivedMethodDecl::GetOwner(TCIMContext const&) const { return fOwner; }

}  // namespace NQRVZEP20
