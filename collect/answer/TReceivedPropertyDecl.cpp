// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedPropertyDecl.h"

#include "collect/answer/TReceivedNamespace.h"

namespace NQRVZEP20 {

TReceivedPropertyDecl::TReceivedPropertyDecl(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TFacts facts)
    : TReceivedElement(ns, std::move(name)), fFacts(std::move(facts)) {}

TCIMValue::TCIMType TReceivedPropertyDecl::GetType(TCIMContext const&) const { return fFacts.fType; }

TCIMValue TReceivedPropertyDecl::GetDefaultValue(TCIMContext const&) const {
  if (fFacts.fDefaultAt != kNoDefault) return boost::shared_ptr<TReceivedNamespace>(fNamespace)->ValueAt(fFacts.fDefaultAt);
  TCIMValue null;
  null.SetNullValue(fFacts.fType, 0);
  return null;
}

bool TReceivedPropertyDecl::IsKey(TCIMContext const&) const {
  if (fFacts.fKeyFailure) fFacts.fKeyFailure->Throw();
  return fFacts.fIsKey;
}

boost::weak_ptr<ICIMNamedElement> TReceivedPropertyDecl::GetOwner(TCIMContext const&) const { return fFacts.fOwner; }

}  // namespace NQRVZEP20
