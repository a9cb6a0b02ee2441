// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMProperty.h"
#include "TStoredValue.h"

namespace NQRVZEP20 {

class TMemoryPropertyDecl;

// One property value. Created by TMemoryClass, for an instance or for the class itself.
class TMemoryProperty : public ICIMProperty {
public:
  // Starts with the declared default.
  explicit TMemoryProperty(boost::shared_ptr<TMemoryPropertyDecl const> declaration);

  TCIMValue GetValue(TCIMContext const& context) const override;
  void SetValue(TCIMValue const& value, TCIMContext const& context) override;
  std::string GetName(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(TCIMContext const& context) const override;

  std::string const& Name() const;

  // Afterwards SetValue throws kZEPStatusInvalidOpSequence: the instance is stored by this key.
  void Fix() { fIsFixed = true; }

  // Makes a reference, or an array of references, NULL.
  void DropReference();

private:
  boost::shared_ptr<TMemoryPropertyDecl const> fDeclaration;
  TStoredValue fValue;  // always of the declared type
  bool fIsFixed = false;
};

}  // namespace NQRVZEP20
