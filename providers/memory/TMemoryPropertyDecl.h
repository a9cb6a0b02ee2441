// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMPropertyDecl.h"
#include "TMemoryNamedElement.h"
#include "TStoredValue.h"

namespace NQRVZEP20 {

class TMemoryClass;

// A property declaration. Created by TMemoryClass.
class TMemoryPropertyDecl : public TMemoryNamedElement<ICIMPropertyDecl> {
public:
  TMemoryPropertyDecl(std::string const& name, TCIMValue const& defaultValue, boost::weak_ptr<TMemoryClass> owner,
                      boost::weak_ptr<ICIMNamespace> ns);

  TCIMValue::TCIMType GetType(TCIMContext const& context) const override;
  TCIMValue GetDefaultValue(TCIMContext const& context) const override;
  bool IsKey(TCIMContext const& context) const override;
  boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const override;

  boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, TCIMValue const& value,
                                                unsigned int flavor, TCIMContext const& context) override;

private:
  boost::shared_ptr<TMemoryPropertyDecl const> OverriddenDecl() const;  // empty when there is none

  TStoredValue fDefaultValue;
  boost::weak_ptr<TMemoryClass> fOwner;
};

}  // namespace NQRVZEP20
