// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedProperty.h"

#include "TZEPException.h"
#include "collect/answer/TReceivedNamespace.h"

namespace NQRVZEP20 {

TCIMValue TReceivedProperty::GetValue(TCIMContext const&) const {
  return boost::shared_ptr<TReceivedNamespace>(fNamespace)->ValueAt(fAt);
}

void TReceivedProperty::SetValue(TCIMValue const&, TCIMContext const&) { RefuseChange(); }

std::string TReceivedProperty::GetName(TCIMContext const&) const {
  boost::shared_ptr<TReceivedNamespace> const ns(fNamespace);
  return fName->fName;
}

boost::shared_ptr<ICIMPropertyDecl const> TReceivedProperty::GetDeclaration(TCIMContext const&) const {
  boost::shared_ptr<TReceivedNamespace> const ns(fNamespace);
  if (!fName->fDeclaration) throw TZEPException(kZEPStatusNotFound);
  return fName->fDeclaration;
}

}  // namespace NQRVZEP20
