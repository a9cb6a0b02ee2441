// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMQualifierDecl.h"

#include <string>

namespace NQRVZEP20 {

// A qualifier declaration. Created by TMemoryNamespace; immutable.
class TMemoryQualifierDecl : public ICIMQualifierDecl {
public:
  TMemoryQualifierDecl(std::string const& name, TCIMValue const& defaultValue, unsigned int scope, unsigned int flavor);

  std::string GetName(TCIMContext const& context) const override;
  TCIMValue::TCIMType GetType(TCIMContext const& context) const override;
  unsigned int GetScope(TCIMContext const& context) const override;
  unsigned int GetFlavor(TCIMContext const& context) const override;
  TCIMValue GetDefaultValue(TCIMContext const& context) const override;

  std::string const& Name() const { return fName; }

private:
  std::string fName;
  TCIMValue fDefaultValue;
  unsigned int fScope;
  unsigned int fFlavor;
};

}  // namespace NQRVZEP20
