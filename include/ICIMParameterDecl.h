#pragma once

#include "ICIMNamedElement.h"

namespace NQRVZEP20 {

class ICIMMethodDecl;

// The declaration of one method parameter. That it is an input or an output is told by its qualifiers In and Out.
class ZEP_EXPORT ICIMParameterDecl : public ICIMNamedElement {
public:
  ~ICIMParameterDecl() override;

  virtual TCIMValue::TCIMType GetType(TCIMContext const& context) const = 0;
  virtual unsigned int GetMaxArraySize(TCIMContext const& context) const = 0;  // 0: unbounded, or not an array

  // The name of the class that a reference, or an array of references, refers to; empty for other types.
  virtual std::string GetReferencedClassName(TCIMContext const& context) const = 0;

  // The method that it belongs to. Has a body, which answers with an empty pointer.
  virtual boost::weak_ptr<ICIMMethodDecl> GetMethod(TCIMContext const& context) const;
};

}  // namespace NQRVZEP20
