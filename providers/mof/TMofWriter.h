// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

class ICIMMethodDecl;
class ICIMNamedElement;
class ICIMParameterDecl;
class ICIMProperty;
class ICIMPropertyDecl;
class ICIMQualifier;
class ICIMQualifierDecl;

// Writes declarations as MOF, one after another. Long lists and texts are split into lines.
class TMofWriter {
public:
  void WriteQualifierDecl(ICIMQualifierDecl const& decl);
  void WriteClass(ICIMClass const& cls);
  void WriteInstance(ICIMInstance const& instance);

  std::string const& GetText() const { return fText; }

private:
  void WriteQualifiers(ICIMNamedElement const& element, std::size_t indent);
  void WriteProperty(ICIMPropertyDecl const& property, TCIMValue const& initial);
  void WriteMethod(ICIMMethodDecl const& method);
  void WriteParameter(ICIMParameterDecl const& parameter);

  std::string fText;
};

}  // namespace NQRVZEP20
