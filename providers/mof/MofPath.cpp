// SPDX-License-Identifier: Apache-2.0

// Object paths in the form of DSP0004.

#include "providers/mof/MofValues.h"

#include "ICIMClass.h"
#include "ICIMPropertyDecl.h"
#include "providers/memory/CIMNames.h"
#include "providers/mof/MofNumbers.h"
#include "providers/mof/MofStrings.h"
#include "providers/mof/TMofLexer.h"

#include <utility>

namespace NQRVZEP20 {

namespace {

TCIMContext const kNone;

// Reads the keys of a path.
class TKeyReader {
public:
  TKeyReader(std::string keys, boost::shared_ptr<ICIMNamespace> ns)
      : fKeys{"object path", std::move(keys)}, fLexer(fKeys), fNamespace(ns) {}

  void ReadInto(TCIMReference& path) {
    for (bool isMore = true; isMore; isMore = TakeComma()) {
      TMofToken const name = Take(TMofToken::kName);
      if (Take(TMofToken::kMark).fText != "=") Refuse(name);
      std::string const key(name.fText);
      auto const type = path.GetClass()->GetPropertyDecl(key, kNone)->GetType(kNone);
      path.AddKeyValue(key, ReadMofValue(TakeValue(type), type, 0, fNamespace));
    }
  }

private:
  TMofToken Take(TMofToken::EKind kind) {
    TMofToken const token = fLexer.Next();
    if (token.fKind != kind) Refuse(token);
    return token;
  }

  bool TakeComma() {
    TMofToken const token = fLexer.Next();
    if (token.fKind != TMofToken::kEnd && token.fText != ",") Refuse(token);
    return token.fKind != TMofToken::kEnd;
  }

  TMofValue TakeValue(TCIMValue::TCIMType type) {
    TMofToken const token = fLexer.Next();
    TMofLiteral literal{TMofLiteral::kNull, {&fKeys, token.fText}, {}};
    bool const isQuoted = token.fKind == TMofToken::kString;
    if (isQuoted && type >= TCIMValue::TCIMType::kCIMTypeString) {
      literal.fKind = TMofLiteral::kString;
      AppendUnescaped(literal.fString, literal.fSpan);
    } else if (token.fKind == TMofToken::kChar)
      literal.fKind = TMofLiteral::kChar;
    else {  // a word or a number, with or without quotes
      if (isQuoted) literal.fSpan.fText = token.fText.substr(1, token.fText.size() - 2);
      std::string_view const word = literal.fSpan.fText;
      literal.fKind = IsSameName(word, "true") || IsSameName(word, "false") ? TMofLiteral::kBoolean : TMofLiteral::kNumber;
      if (word.empty()) Refuse(token);
    }
    return {literal.fSpan, false, {literal}};
  }

  [[noreturn]] void Refuse(TMofToken const& token) const { throw TMofError({&fKeys, token.fText}, "not a key of a path"); }

  TMofFile const fKeys;
  TMofLexer fLexer;
  boost::shared_ptr<ICIMNamespace> fNamespace;
};

TCIMValue Read(std::string const& text, boost::shared_ptr<ICIMNamespace> ns) {
  std::size_t const start = text.rfind(':', text.find('=')) + 1;  // 0 without ":"
  std::size_t const dot = text.find('.', start);
  TCIMReference path(ns, kNone);
  path.SetClassName(text.substr(start, dot == text.npos ? dot : dot - start));
  if (dot != text.npos) TKeyReader(text.substr(dot + 1), ns).ReadInto(path);
  return TCIMValue(path);
}

}  // namespace

TCIMValue ReadMofPath(std::string const& path, TMofSpan const& span, boost::shared_ptr<ICIMNamespace> ns) {
  try {
    return Read(path, ns);
  } catch (TZEPException const&) {
    throw TMofError(span, "expected the path of an object whose class is declared, such as \"X_Disk.Id=5\"",
                    kZEPStatusInvalidReference);
  }
}

std::string MofPathText(TCIMReference const& path) {
  if (!path.GetClass()) ThrowUnprintable();
  std::string text = path.GetClassName();
  char before = '.';
  path.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) {
    text += std::exchange(before, ',') + key.first + "=" + MofScalarText(key.second);
    return true;
  });
  return text;
}

}  // namespace NQRVZEP20
