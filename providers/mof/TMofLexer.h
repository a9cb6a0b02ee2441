// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/TMofError.h"

#include <string_view>

namespace NQRVZEP20 {

struct TMofToken {
  enum EKind {
    kEnd,
    kName,    // a keyword too: keywords are recognised by where they stand
    kNumber,  // as written, with its sign
    kString,  // with its quotes and escapes; neighbours are not joined yet
    kChar,    // 'a', with its quotes
    kAlias,   // $Name
    kPragma,  // #pragma
    kMark     // one of ( ) { } [ ] , ; : =
  };

  EKind fKind;
  std::string_view fText;  // of the file
};

// Cuts a text into tokens; blanks and comments fall away. Throws TMofError for what is no token.
class TMofLexer {
public:
  explicit TMofLexer(TMofFile const& file) : TMofLexer(file, file.fText.data()) {}

  // From `start` on, which lies in the text.
  TMofLexer(TMofFile const& file, char const* start) : fFile(file), fNext(start), fEnd(file.fText.data() + file.fText.size()) {}

  TMofToken Next();  // at the end of the text kEnd, as often as it is called

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
