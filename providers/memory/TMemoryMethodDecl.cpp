// SPDX-License-Identifier: Apache-2.0
#include "TMemoryMethodDecl.h"

#include "CIMTypes.h"

namespace NQRVZEP20 {

namespace {

// Checks the type of a parameter; see ICIMMethodDecl::AddParameterDecl.
void RequireParameterType(TCIMValue::TCIMType type, unsigned int maxArraySize, std::string const& referencedClassName) {
  if (!HasTypeName(type)) throw TZEPException(kZEPStatusTypeMismatch);
  if (maxArraySize != 0 && !IsArrayType(type)) throw TZEPException(kZEPStatusNotArray);
  if (!referencedClassName.empty() && BaseTypeOf(type) != TCIMValue::TCIMType::kCIMTypeReference)
    throw TZEPException(kZEPStatusNotReference);
}

}  // namespace

TMemoryMethodDecl::TMemoryMethodDecl(std::string const& name, TCIMValue::TCIMType returnType,
                                     boost::weak_ptr<ICIMNamedElement> owner, boost::weak_ptr<ICIMNamespace> ns)
    : TMemoryNamedElement(name, ns), fReturnType(returnType), fOwner(owner) {}

TCIMValue::TCIMType TMemoryMethodDecl::GetReturnType(TCIMContext const&) const { return fReturnType; }

boost::shared_ptr<ICIMParameterDecl> TMemoryMethodDecl::AddParameterDecl(std::string const& name, TCIMValue::TCIMType type,
                                                                         unsigned int maxArraySize,
                                                                         std::string const& referencedClassName,
                                                                         TCIMContext const&) {
  RequireCIMName(name);
  RequireParameterType(type, maxArraySize, referencedClassName);
  if (fParameterDecls.Has(name)) throw TZEPException(kZEPStatusAlreadyExists);

  auto const self = boost::static_pointer_cast<TMemoryMethodDecl>(shared_from_this());
  auto const decl = boost::make_shared<TMemoryParameterDecl>(name, type, maxArraySize, referencedClassName, self, Namespace());
  fParameterDecls.Add(decl);
  return decl;
}

void TMemoryMethodDecl::EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)> callback,
                                                TCIMContext const&) const {
  VisitEach(fParameterDecls.Elements(), callback);
}

boost::weak_ptr<ICIMNamedElement> TMemoryMethodDecl::GetOwner(TCIMContext const&) const { return fOwner; }

}  // namespace NQRVZEP20
