// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMQualifierDecl.h"

#include <boost/weak_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class TReceivedNamespace;

// A qualifier declaration of a received namespace. It stores the position of the default value in the serialised bytes.
class TReceivedQualifierDecl : public ICIMQualifierDecl {
public:
  TReceivedQualifierDecl(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TCIMValue::TCIMType type, unsigned int scope,
                         unsigned int flavor, std::size_t at);

  std::string GetName(TCIMContext const& context) const override;
  TCIMValue::TCIMType GetType(TCIMContext const& context) const override;
  unsigned int GetScope(TCIMContext const& context) const override;
  unsigned int GetFlavor(TCIMContext const& context) const override;
  TCIMValue GetDefaultValue(TCIMContext const& context) const override;

  std::string const& Name() const { return fName; }

private:
  boost::weak_ptr<TReceivedNamespace> const fNamespace;
  std::string const fName;
  TCIMValue::TCIMType const fType;
  unsigned int const fScope, fFlavor;
  std::size_t const fAt;
};

}  // namespace NQRVZEP20
