// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedQualifierDecl.h"

#include "collect/answer/TReceivedNamespace.h"

#include <utility>

namespace NQRVZEP20 {

TReceivedQualifierDecl::TReceivedQualifierDecl(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TCIMValue::TCIMType type,
                                               unsigned int scope, unsigned int flavor, std::size_t at)
    : fNamespace(ns), fName(std::move(name)), fType(type), fScope(scope), fFlavor(flavor), fAt(at) {}

std::string TReceivedQualifierDecl::GetName(TCIMContext const&) const { return fName; }

TCIMValue::TCIMType TReceivedQualifierDecl::GetType(TCIMContext const&) const { return fType; }

unsigned int TReceivedQualifierDecl::GetScope(TCIMContext const&) const { return fScope; }

unsigned int TReceivedQualifierDecl::GetFlavor(TCIMContext const&) const { return fFlavor; }

TCIMValue TReceivedQualifierDecl::GetDefaultValue(TCIMContext const&) const {
  return boost::shared_ptr<TReceivedNamespace>(fNamespace)->ValueAt(fAt);
}

}  // namespace NQRVZEP20
