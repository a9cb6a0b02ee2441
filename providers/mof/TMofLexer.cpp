// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofLexer.h"

#include "providers/memory/CIMNames.h"

#include <algorithm>
#include <array>
#include <string>

namespace NQRVZEP20 {

namespace {

enum ECharacter : unsigned char { kOther, kBlank, kLetter, kDigit, kMarkCharacter };

// The kind of each byte. Every byte from 0x80 up counts as a letter, so that names may contain UTF-8.
constexpr std::array<ECharacter, 256> MakeCharacters() {
  std::array<ECharacter, 256> kinds{};
  for (int c = 0x80; c < 0x100; ++c) kinds[c] = kLetter;
  for (int c = 'a'; c <= 'z'; ++c) kinds[c] = kinds[c - 'a' + 'A'] = kLetter;
  for (int c = '0'; c <= '9'; ++c) kinds[c] = kDigit;
  kinds['_'] = kLetter;
  for (char const c : {' ', '\t', '\n', '\r', '\f', '\v'}) kinds[c] = kBlank;
  for (char const c : {'(', ')', '{', '}', '[', ']', ',', ';', ':', '='}) kinds[c] = kMarkCharacter;
  return kinds;
}

constexpr std::array<ECharacter, 256> kCharacters = MakeCharacters();

ECharacter KindOf(char c) { return kCharacters[static_cast<unsigned char>(c)]; }
bool IsOfName(char c) { return KindOf(c) == kLetter || KindOf(c) == kDigit; }

}  // namespace

TMofToken TMofLexer::Next() {
  SkipBlanksAndComments();
  if (fNext == fEnd) return Take(TMofToken::kEnd, fEnd);
  switch (KindOf(*fNext)) {
    case kLetter:
      return Take(TMofToken::kName, EndOfName(fNext));
    case kMarkCharacter:
      return Take(TMofToken::kMark, fNext + 1);
    default:
      break;
  }
  if (IsNumber()) return Take(TMofToken::kNumber, EndOfNumber());
  if (*fNext == '"') return TakeQuoted(TMofToken::kString, '"');
  if (*fNext == '\'') return TakeQuoted(TMofToken::kChar, '\'');
  if (*fNext == '$' && EndOfName(fNext + 1) != fNext + 1) return Take(TMofToken::kAlias, EndOfName(fNext + 1));
  if (*fNext == '#') {
    char const* const end = EndOfName(fNext + 1);
    if (IsSameName({fNext, static_cast<std::size_t>(end - fNext)}, "#pragma")) return Take(TMofToken::kPragma, end);
  }
  Refuse(fNext + 1, "unexpected character");
}

void TMofLexer::SkipBlanksAndComments() {
  while (fNext != fEnd) {
    if (KindOf(*fNext) == kBlank)
      ++fNext;
    else if (*fNext == '/')
      SkipComment();
    else
      return;
  }
}

void TMofLexer::SkipComment() {
  std::string_view const rest(fNext, static_cast<std::size_t>(fEnd - fNext));
  if (rest.substr(0, 2) == "//") {
    fNext += std::min(rest.find('\n'), rest.size());
    return;
  }
  if (rest.substr(0, 2) != "/*") Refuse(fNext + 1, "unexpected character");
  std::size_t const end = rest.find("*/", 2);
  if (end == rest.npos) Refuse(fNext + 2, "this comment is not closed by \"*/\"");
  fNext += end + 2;
}

TMofToken TMofLexer::Take(TMofToken::EKind kind, char const* end) {
  std::string_view const text(fNext, static_cast<std::size_t>(end - fNext));
  fNext = end;
  return {kind, text};
}

TMofToken TMofLexer::TakeQuoted(TMofToken::EKind kind, char quote) {
  for (char const* at = fNext + 1; at != fEnd && *at != '\n'; ++at) {
    if (*at == quote) return Take(kind, at + 1);
    if (*at == '\\' && ++at == fEnd) break;
  }
  Refuse(fNext + 1, kind == TMofToken::kString ? "this string is not closed on its line"
                                               : "this character literal is not closed on its line");
}

char const* TMofLexer::EndOfName(char const* at) const {
  while (at != fEnd && IsOfName(*at)) ++at;
  return at;
}

bool TMofLexer::IsNumber() const {
  char const* at = fNext;
  if (*at == '+' || *at == '-') ++at;
  if (at != fEnd && *at == '.') ++at;
  return at != fEnd && KindOf(*at) == kDigit;
}

// Takes every character that can be part of a number; the number is checked when its type is known. A sign belongs to it only
// after the "e" of an exponent, which in a hexadecimal number is a digit.
char const* TMofLexer::EndOfNumber() const {
  char const* at = fNext + 1;
  bool const isHexadecimal = fEnd - fNext > 2 && std::string_view(fNext, 3).find_first_of("xX") != std::string_view::npos;
  for (; at != fEnd; ++at) {
    bool const isAfterE = !isHexadecimal && (at[-1] == 'e' || at[-1] == 'E');
    if (!IsOfName(*at) && *at != '.' && !(isAfterE && (*at == '+' || *at == '-'))) break;
  }
  return at;
}

void TMofLexer::Refuse(char const* end, char const* what) const {
  throw TMofError({&fFile, std::string_view(fNext, static_cast<std::size_t>(end - fNext))}, what);
}

}  // namespace NQRVZEP20
