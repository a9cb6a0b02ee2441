// SPDX-License-Identifier: Apache-2.0
#include "TMemoryParameterDecl.h"

#include "ICIMMethodDecl.h"

namespace NQRVZEP20 {

TMemoryParameterDecl::TMemoryParameterDecl(std::string const& name, TCIMValue::TCIMType type, unsigned int maxArraySize,
                                           std::string const& referencedClassName, boost::weak_ptr<ICIMMethodDecl> method,
                                           boost::weak_ptr<ICIMNamespace> ns)
    : TMemoryNamedElement(name, ns),
      fType(type),
      fMaxArraySize(maxArraySize),
      fReferencedClassName(referencedClassName),
      fMethod(method) {}

TCIMValue::TCIMType TMemoryParameterDecl::GetType(TCIMContext const&) const { return fType; }

unsigned int TMemoryParameterDecl::GetMaxArraySize(TCIMContext const&) const { return fMaxArraySize; }

std::string TMemoryParameterDecl::GetReferencedClassName(TCIMContext const&) const { return fReferencedClassName; }

boost::weak_ptr<ICIMMethodDecl> TMemoryParameterDecl::GetMethod(TCIMContext const&) const { return fMethod; }

}  // namespace NQRVZEP20
