// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMProperty.h"

#include <boost/weak_ptr.hpp>

#include <string>
#include <utility>

namespace NQRVZEP20 {

class TReceivedNamespace;
class TReceivedPropertyDecl;

// The name of a property, and its declaration, which is empty if no class of the namespace declares it.
struct TReceivedPropertyName {
  std::string fName;
  boost::shared_ptr<TReceivedPropertyDecl const> fDeclaration;
};

// A property of an instance or class of a received namespace. It stores the position of the value in the serialised bytes.
class TReceivedProperty : public ICIMProperty {
public:
  // `name` is owned by the namespace.
  TReceivedProperty(boost::weak_ptr<TReceivedNamespace> ns, TReceivedPropertyName const& name, std::size_t at)
      : fNamespace(std::move(ns)), fName(&name), fAt(at) {}

  // Throws the provider's exception if the provider threw one instead of returning the value.
  TCIMValue GetValue(TCIMContext const& context) const override;

  void SetValue(TCIMValue const& value, TCIMContext const& context) override;
  std::string GetName(TCIMContext const& context) const override;

  // Throws kZEPStatusNotFound if no class of the namespace declares the property.
  boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(TCIMContext const& context) const override;

private:
  boost::weak_ptr<TReceivedNamespace> const fNamespace;
  TReceivedPropertyName const* const fName;
  std::size_t const fAt;
};

}  // namespace NQRVZEP20
