// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMProperty.h"

#include <boost/weak_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class TReceivedNamespace;

// A property of an instance or class of a received namespace, whose value is at a position of the bytes.
class TReceivedProperty : public ICIMProperty {
public:
  TReceivedProperty(boost::weak_ptr<TReceivedNamespace> ns, std::string name,
                    boost::shared_ptr<ICIMPropertyDecl const> declaration, std::size_t at);

  // Throws the exception of the provider when it could not give the value.
  TCIMValue GetValue(TCIMContext const& context) const override;

  void SetValue(TCIMValue const& value, TCIMContext const& context) override;
  std::string GetName(TCIMContext const& context) const override;

  // Throws kZEPStatusNotFound when no class of the namespace declares the property.
  boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(TCIMContext const& context) const override;

private:
  boost::weak_ptr<TReceivedNamespace> const fNamespace;
  std::string const fName;
  boost::shared_ptr<ICIMPropertyDecl const> const fDeclaration;  // may be empty
  std::size_t const fAt;
};

}  // namespace NQRVZEP20
