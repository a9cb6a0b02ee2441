// SPDX-License-Identifier: Apache-2.0
#include "TMemoryQualifierDecl.h"

namespace NQRVZEP20 {

TMemoryQualifierDecl::TMemoryQualifierDecl(std::string const& name, TCIMValue const& defaultValue, unsigned int scope,
                                           unsigned int flavor)
    : fName(name), fDefaultValue(defaultValue), fScope(scope), fFlavor(flavor) {}

std::string TMemoryQualifierDecl::GetName(TCIMContext const&) const { return fName; }

TCIMValue::TCIMType TMemoryQualifierDecl::GetType(TCIMContext const&) const { return fDefaultValue.GetType(); }

unsigned int TMemoryQualifierDecl::GetScope(TCIMContext const&) const { return fScope; }

unsigned int TMemoryQualifierDecl::GetFlavor(TCIMContext const&) const { return fFlavor; }

TCIMValue TMemoryQualifierDecl::GetDefaultValue(TCIMContext const&) const { return fDefaultValue; }

}  // namespace NQRVZEP20
