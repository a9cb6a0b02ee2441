// SPDX-License-Identifier: Apache-2.0
#include "TMemoryProperty.h"

#include "CIMTypes.h"
#include "Fitting.h"
#include "TMemoryPropertyDecl.h"
#include "TZEPFailure.h"

#include <utility>

namespace NQRVZEP20 {

TMemoryProperty::TMemoryProperty(boost::shared_ptr<TMemoryPropertyDecl const> declaration)
    : fDeclaration(declaration), fValue(declaration->GetDefaultValue(TCIMContext())) {}

TCIMValue TMemoryProperty::GetValue(TCIMContext const&) const { return fValue.Get(); }

void TMemoryProperty::SetValue(TCIMValue const& value, TCIMContext const&) {
  if (fIsFixed) throw TZEPException(kZEPStatusInvalidOpSequence);
  if (value.GetType() != fValue.GetType()) throw TZEPFailure(kZEPStatusTypeMismatch, WhyNotOf(fValue.GetType(), value));
  fValue = TStoredValue(value);
}

void TMemoryProperty::DropReference() {
  if (BaseTypeOf(fValue.GetType()) != TCIMValue::TCIMType::kCIMTypeReference) return;
  TCIMValue null = fValue.Get();
  null.SetNullValue(null.GetType(), null.GetMaxArraySize());
  fValue = TStoredValue(null);
}

std::string TMemoryProperty::GetName(TCIMContext const& context) const { return fDeclaration->GetName(context); }

std::string const& TMemoryProperty::Name() const { return fDeclaration->Name(); }

boost::shared_ptr<ICIMPropertyDecl const> TMemoryProperty::GetDeclaration(TCIMContext const&) const { return fDeclaration; }

}  // namespace NQRVZEP20
