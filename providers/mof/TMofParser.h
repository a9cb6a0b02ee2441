// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/MofTree.h"
#include "providers/mof/TMofLexer.h"
#include "providers/mof/TMofSources.h"

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// Parses the syntax of MOF; the builder checks the semantics. Throws TMofError, whose message names the expected token.
class TMofParser {
public:
  explicit TMofParser(TMofFile const& file) : TMofParser(file, file.fText.data()) {}
  TMofParser(TMofFile const& file, char const* start);  // `start`: a position in the text of the file

  // Reads the complete file, and the files that it includes, into the document.
  void ParseFile(TMofDocument& document, TMofSources& sources);

  // Read one declaration at the start position. The heads end before the features or values.
  TMofClass ParseClass();            // starts at its qualifiers or at "class"
  TMofClass ParseClassHead();        // starts at "class"
  TMofInstance ParseInstance();      // starts at "instance"
  TMofInstance ParseInstanceHead();  // starts at "instance"

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
  TMofSpan ParseAlias();
  TMofValue ParseValue();
  TMofValue ParseArray();
  TMofLiteral ParseLiteral();
  template <class TParseItem>
  void ParseListUpTo(char end, TParseItem const& parseItem);
  std::string ParseString();

  // ---- Tokens ----
  TMofSpan Here() const { return {&fFile, fToken.fText}; }
  void Advance() { fToken = fLexer.Next(); }
  bool IsMark(char mark) const { return fToken.fKind == TMofToken::kMark && fToken.fText.front() == mark; }
  bool IsWord(std::string_view word) const;
  bool Skip(char mark);  // advances if the token is that mark, and returns whether it was
  bool SkipWord(std::string_view word);
  void Expect(char mark);
  TMofSpan ExpectName(char const* what);
  [[noreturn]] void Refuse(std::string const& expected) const;

  TMofFile const& fFile;
  TMofLexer fLexer;
  TMofToken fToken;  // the next one
};

}  // namespace NQRVZEP20
