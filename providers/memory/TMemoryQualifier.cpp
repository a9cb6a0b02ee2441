#include "TMemoryQualifier.h"

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

TMemoryQualifier::TMemoryQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, boost::weak_ptr<ICIMNamedElement> owner,
                                   TCIMValue const& value, unsigned int flavor)
    : fDeclaration(declaration), fOwner(owner), fValue(value), fFlavor(flavor) {}

std::string TMemoryQualifier::GetName(TCIMContext const& context) const { return fDeclaration->GetName(context); }

TCIMValue TMemoryQualifier::GetValue(TCIMContext const&) const { return fValue; }

unsigned int TMemoryQualifier::GetFlavor(TCIMContext const&) const { return fFlavor; }

boost::shared_ptr<ICIMQualifierDecl> TMemoryQualifier::GetDeclaration(TCIMContext const&) const { return fDeclaration; }

boost::weak_ptr<ICIMNamedElement> TMemoryQualifier::GetOwner(TCIMContext const&) const { return fOwner; }

bool TMemoryQualifier::IsSet() const {
  const bool isFalse = !fValue.IsNull() && fValue.GetType() == TCIMValue::TCIMType::kCIMTypeBoolean && !static_cast<bool>(fValue);
  return !isFalse;
}

}  // namespace NQRVZEP20
