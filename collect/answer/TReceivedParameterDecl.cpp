// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedParameterDecl.h"

#include "ICIMMethodDecl.h"

namespace NQRVZEP20 {

TReceivedParameterDecl::TReceivedParameterDecl(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TFacts facts)
    : TReceivedElement(ns, std::move(name)), fFacts(std::move(facts)) {}

TCIMValue::TCIMType TReceivedParameterDecl::GetType(TCIMContext const&) const { return fFacts.fType; }

unsigned int TReceivedParameterDecl::GetMaxArraySize(TCIMContext const&) const { return fFacts.fMaxArraySize; }

std::string TReceivedParameterDecl::GetReferencedClassName(TCIMContext const&) const { return fFacts.fReferencedClassName; }

boost::weak_ptr<ICIMMethodDecl> TReceivedParameterDecl::GetMethod(TCIMContext const&) const { return fFacts.fMethod; }

}  // namespace NQRVZEP20
