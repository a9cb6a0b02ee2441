// SPDX-License-Identifier: Apache-2.0
#include "TMemoryQualifier.h"

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

TMemoryQualifier::TMemoryQualifier(boost::shared_ptr<TMemoryQualifierDecl> declaration, boost::weak_ptr<ICIMNamedElement> owner,
                                   TCIMValue const& value, unsigned int flavor)
    : fDeclaration(declaration), fOwner(owner), fValue(value), fFlavor(flavor) {}

std::string TMemoryQualifier::GetName(TCIMContext const& context) const { return fDeclaration->GetName(context); }

TCIMValue TMemoryQualifier::GetValue(TCIMContext const&) const { return fValue.Get(); }

unsigned int TMemoryQualifier::GetFlavor(TCIMContext const&) const { return fFlavor; }

boost::shared_ptr<ICIMQualifierDecl> TMemoryQualifier::GetDeclaration(TCIMContext const&) const { return fDeclaration; }

boost::weak_ptr<ICIMNamedElement> TMemoryQualifier::GetOwner(TCIMContext const&) const { return fOwner; }

bool TMemoryQualifier::IsSet() const { return !fValue.IsFalse(); }

}  // namespace NQRVZEP20
