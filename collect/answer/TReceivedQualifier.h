// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamedElement.h"
#include "ICIMQualifier.h"

#include <string>

namespace NQRVZEP20 {

class TReceivedNamespace;

// A qualifier of a received namespace. It stores the position of the value in the serialised bytes.
class TReceivedQualifier : public ICIMQualifier {
public:
  // `declaration` may be empty.
  TReceivedQualifier(boost::weak_ptr<TReceivedNamespace> ns, std::string name, std::size_t at, unsigned int flavor,
                     boost::shared_ptr<ICIMQualifierDecl> declaration, boost::weak_ptr<ICIMNamedElement> owner);

  std::string GetName(TCIMContext const& context) const override;
  TCIMValue GetValue(TCIMContext const& context) const override;
  unsigned int GetFlavor(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMQualifierDecl> GetDeclaration(TCIMContext const& context) const override;
  boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const override;

  std::string const& Name() const { return fName; }

private:
  boost::weak_ptr<TReceivedNamespace> const fNamespace;
  std::string const fName;
  std::size_t const fAt;
  unsigned int const fFlavor;
  boost::shared_ptr<ICIMQualifierDecl> const fDeclaration;
  boost::weak_ptr<ICIMNamedElement> const fOwner;
};

}  // namespace NQRVZEP20
