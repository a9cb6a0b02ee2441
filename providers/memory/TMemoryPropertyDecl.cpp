// SPDX-License-Identifier: Apache-2.0
#include "TMemoryPropertyDecl.h"

#include "TMemoryClass.h"

namespace NQRVZEP20 {

namespace {

constexpr char kKey[] = "Key";

}  // namespace

TMemoryPropertyDecl::TMemoryPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                         boost::weak_ptr<TMemoryClass> owner, boost::weak_ptr<ICIMNamespace> ns)
    : TMemoryNamedElement(name, ns), fDefaultValue(defaultValue), fOwner(owner) {}

TCIMValue::TCIMType TMemoryPropertyDecl::GetType(TCIMContext const&) const { return fDefaultValue.GetType(); }

TCIMValue TMemoryPropertyDecl::GetDefaultValue(TCIMContext const&) const { return fDefaultValue.Get(); }

bool TMemoryPropertyDecl::IsKey(TCIMContext const&) const {
  if (IsMarked(kKey)) return true;
  for (auto overridden = OverriddenDecl(); overridden; overridden = overridden->OverriddenDecl())
    if (overridden->IsMarked(kKey)) return true;
  return false;
}

boost::weak_ptr<ICIMNamedElement> TMemoryPropertyDecl::GetOwner(TCIMContext const&) const { return fOwner; }

boost::shared_ptr<ICIMQualifier> TMemoryPropertyDecl::AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration,
                                                                   TCIMValue const& value, unsigned int flavor,
                                                                   TCIMContext const& context) {
  if (!declaration) throw TZEPException(kZEPStatusNotFound);
  boost::shared_ptr<TMemoryClass> const owner(fOwner);
  if (owner->HasMadeInstances() && IsSameName(declaration->GetName(context), kKey))
    throw TZEPException(kZEPStatusInvalidOpSequence);
  return TMemoryNamedElement::AddQualifier(declaration, value, flavor, context);
}

boost::shared_ptr<TMemoryPropertyDecl const> TMemoryPropertyDecl::OverriddenDecl() const {
  boost::shared_ptr<TMemoryClass> const superClass = boost::shared_ptr<TMemoryClass>(fOwner)->SuperClass();
  return superClass ? superClass->FindPropertyDecl(Name()) : boost::shared_ptr<TMemoryPropertyDecl const>();
}

}  // namespace NQRVZEP20
