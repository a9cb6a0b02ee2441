// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

class ICIMMethodDecl;

// The declaration of one method parameter. Its qualifiers In and Out mark it as an input or an output.
class ZEP_EXPORT ICIMParameterDecl : public ICIMNamedElement {
public:
  ~ICIMParameterDecl() override;

  virtual TCIMValue::TCIMType GetType(TCIMContext const& context) const = 0;
  virtual unsigned int GetMaxArraySize(TCIMContext const& context) const = 0;  // 0: unbounded, or not an array

  // The name of the class that a reference, or an array of references, refers to; empty for other types.
  virtual std::string GetReferencedClassName(TCIMContext const& context) const = 0;

  // The method that the parameter belongs to. Has a default body, which returns an empty pointer.
  virtual boost::weak_ptr<ICIMMethodDecl> GetMethod(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
