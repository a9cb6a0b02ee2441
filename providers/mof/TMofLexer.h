// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/TMofError.h"

#include <string_view>

namespace NQRVZEP20 {

struct TMofToken {
  enum EKind {
    kEnd,
    kName,    // or a keyword, which the parser recognises by its position
    kNumber,  // as written, with its sign
    kString,  // with its quotes and escapes; adjacent strings are separate tokens
    kChar,    // 'a', with its quotes
    kAlias,   // $Name
    kPragma,  // #pragma
    kMark     // one of ( ) { } [ ] , ; : =
  };

  EKind fKind;
  std::string_view fText;  // of the file
};

// Splits a text into tokens and skips white space and comments. Throws TMofError for text that is not a token.
class TMofLexer {
public:
  explicit TMofLexer(TMofFile const& file) : TMofLexer(file, file.fText.data()) {}

  // Starts at `start`, a position in the text.
  TMofLexer(TMofFile const& file, char const* start) : fFile(file), fNext(start), fEnd(file.fText.data() + file.fText.size()) {}

  TMofToken Next();  // at the end of the text, and at each later call: kEnd

private:
  void SkipBlanksAndComments();
  void SkipComment();
  TMofToken Take(TMofToken::EKind kind, char const* end);
  TMofToken TakeQuoted(TMofToken::EKind kind, char quote);
  char const* EndOfName(char const* at) const;
  char const* EndOfNumber() const;
  bool IsNumber() const;
  [[noreturn]] void Refuse(char const* end, char const* what) const;

  TMofFile const& fFile;
  char const* fNext;
  char const* const fEnd;
};

}  // namespace NQRVZEP20
