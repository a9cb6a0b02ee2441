// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "collect/TNamespaceView.h"
#include "collect/TValueWords.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/TJsonText.h"

#include <map>
#include <string>

namespace NQRVZEP20::zep {

// Writes instances of a namespace as JSON: each with its path and all properties, and each property with type, value, words,
// unit, source, and for a missing value the reason. The declarations of the properties, which many instances share, are read
// once.
//
// Refers to the view, which must outlive the object.
class TInstanceJson {
public:
  explicit TInstanceJson(TNamespaceView const& view, EMessages messages = EMessages::kVerbatim);

  // Appends the instance. `depth`: as in TJsonText. What the provider throws is passed on; the text then ends within the
  // instance.
  void Append(ICIMInstance const& instance, std::string& text, int depth);

  // The instance as a part of a document.
  TJson Of(ICIMInstance const& instance);

private:
  using TDeclaration = boost::shared_ptr<ICIMPropertyDecl const>;
  struct TDeclared {
    TValueWords fWords;
    std::string fUnit;  // empty without one
    bool fIsKey;
    std::string fSource;
  };

  void AppendProperty(ICIMInstance const& instance, ICIMProperty const& property, TJsonText& json);
  void AppendWords(TValueWords const& words, TCIMValue const& value, TJsonText& json) const;
  void AppendMessage(std::string const& message, TJsonText& json) const;
  TDeclared const& DeclaredBy(TDeclaration const& declaration);

  TNamespaceView const& fView;
  EMessages fMessages;
  std::map<TDeclaration, TDeclared> fDeclared;
};

}  // namespace NQRVZEP20::zep
