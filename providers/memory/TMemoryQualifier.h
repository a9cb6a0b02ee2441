// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMQualifier.h"
#include "TMemoryQualifierDecl.h"
#include "TStoredValue.h"

namespace NQRVZEP20 {

// A qualifier of one element. Created by AddQualifier of that element; immutable.
class TMemoryQualifier : public ICIMQualifier {
public:
  TMemoryQualifier(boost::shared_ptr<TMemoryQualifierDecl> declaration, boost::weak_ptr<ICIMNamedElement> owner,
                   TCIMValue const& value, unsigned int flavor);

  std::string GetName(TCIMContext const& context) const override;
  TCIMValue GetValue(TCIMContext const& context) const override;
  unsigned int GetFlavor(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMQualifierDecl> GetDeclaration(TCIMContext const& context) const override;
  boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const override;

  std::string const& Name() const { return fDeclaration->Name(); }

  // False for the boolean value false: a qualifier whose value is false is treated as absent.
  bool IsSet() const;

private:
  boost::shared_ptr<TMemoryQualifierDecl> fDeclaration;
  boost::weak_ptr<ICIMNamedElement> fOwner;
  TStoredValue fValue;
  unsigned int fFlavor;
};

}  // namespace NQRVZEP20
