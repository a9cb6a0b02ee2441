// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMQualifier.h"
#include "TMemoryQualifierDecl.h"
#include "TStoredValue.h"

namespace NQRVZEP20 {

// A qualifier on one element. Made by AddQualifier of that element; never changes.
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

  // False for the boolean value false, with which a qualifier counts as if it were not written.
  bool IsSet() const;

private:
  boost::shared_ptr<TMemoryQualifierDecl> fDeclaration;
  boost::weak_ptr<ICIMNamedElement> fOwner;
  TStoredValue fValue;
  unsigned int fFlavor;
};

}  // namespace NQRVZEP20
