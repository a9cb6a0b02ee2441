// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/MofTree.h"
#include "providers/mof/TMofLexer.h"
#include "providers/mof/TMofSources.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// Reads MOF: its form only, not whether it makes sense. Throws TMofError, which tells what was expected.
class TMofParser {
public:
  explicit TMofParser(TMofFile const& file) : TMofParser(file, file.fText.data()) {}
  TMofParser(TMofFile const& file, char const* start);  // begins there in the text

  // The whole file, and those that it includes, into the document.
  void ParseFile(TMofDocument& document, TMofSources& sources);

  // What stands where the parser begins. Without features, or values, these read no further than they have to.
  TMofClass ParseClass();            // from its qualifiers or from "class"
  TMofClass ParseClassHead();        // from "class"; without features
  TMofInstance ParseInstance();      // from "instance"
  TMofInstance ParseInstanceHead();  // from "instance"; without values

private:
  // ---- Productions ----
  void ParsePragma(TMofDocument& document, TMofSources& sources);
  TMofQualifierDecl ParseQualifierDecl();
  void ParseClassOrInstance(TMofDocument& document);
  TMofQualifiers ParseQualifiers();
  TMofQualifier ParseQualifier();
  unsigned int ParseScope();
  unsigned int ParseFlavor(bool inDeclaration);
  TMofFeature ParseFeature();
  TMofParameter ParseParameter();
  TMofType ParseType();
  TMofType ParseIntrinsicType();
  void ParseArrayMark(TMofType& type);
  TMofPlace ParseAlias();
  TMofValue ParseValue();
  TMofValue ParseArray();
  TMofLiteral ParseLiteral();
  template <class TParseItem>
  void ParseListUpTo(char end, TParseItem const& parseItem);
  std::string ParseString();

  // ---- Tokens ----
  TMofPlace Here() const { return {&fFile, fToken.fText}; }
  void Advance() { fToken = fLexer.Next(); }
  bool IsMark(char mark) const { return fToken.fKind == TMofToken::kMark && fToken.fText.front() == mark; }
  bool IsWord(std::string_view word) const;
  bool Skip(char mark);  // goes on if that mark stands here
  bool SkipWord(std::string_view word);
  void Expect(char mark);
  TMofPlace ExpectName(char const* what);
  [[noreturn]] void Refuse(std::string const& expected) const;

  TMofFile const& fFile;
  TMofLexer fLexer;
  TMofToken fToken;  // the next one
};

}  // namespace NQRVZEP20
