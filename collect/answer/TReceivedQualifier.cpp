// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedQualifier.h"

#include "collect/answer/TReceivedNamespace.h"

#include <utility>

namespace NQRVZEP20 {

TReceivedQualifier::TReceivedQualifier(boost::weak_ptr<TReceivedNamespace> ns, std::string name, std::size_t at,
                                       unsigned int flavor, boost::shared_ptr<ICIMQualifierDecl> declaration,
                                       boost::weak_ptr<ICIMNamedElement> owner)
    : fNamespace(ns), fName(std::move(name)), fAt(at), fFlavor(flavor), fDeclaration(declaration), fOwner(owner) {}

std::string TReceivedQualifier::GetName(TCIMContext const&) const { return fName; }

TCIMValue TReceivedQualifier::GetValue(TCIMContext const&) const {
  return boost::shared_ptr<TReceivedNamespace>(fNamespace)->ValueAt(fAt);
}

unsigned int TReceivedQualifier::GetFlavor(TCIMContext const&) const { return fFlavor; }

boost::shared_ptr<ICIMQualifierDecl> TReceivedQualifier::GetDeclaration(TCIMContext const&) const { return fDeclaration; }

boost::weak_ptr<ICIMNamedElement> TReceivedQualifier::GetOwner(TCIMContext const&) const { return fOwner; }

}  // namespace NQRVZEP20
