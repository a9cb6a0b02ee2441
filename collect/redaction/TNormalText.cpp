// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TNormalText.h"

#include "collect/SafeText.h"
#include "collect/redaction/Texts.h"

#include <algorithm>
#include <charconv>

namespace NQRVZEP20 {

namespace {

constexpr std::string_view kMarks("-\0", 2);

struct TMark {
  std::size_t fSize = 0;
  bool fIsNul = false;
};

// The mark whose code is `digits` hexadecimal digits at `at`; none if it is a letter or a digit.
TMark MarkOfCode(std::string_view text, std::size_t at, std::size_t digits) {
  std::string_view const code = text.substr(std::min(at, text.size()), digits);
  unsigned number = 0;
  if (code.size() < digits || !IsHex(code)) return {};
  std::from_chars(code.data(), code.data() + code.size(), number, 16);
  if (number < 0x80 && IsLetterOrDigit(static_cast<char>(number))) return {};
  return {digits, number == 0};
}

// "x20", "u0020"
TMark MarkOfEscape(std::string_view text, std::size_t at) {
  if (at >= text.size() || (text[at] != 'x' && text[at] != 'u')) return {};
  TMark mark = MarkOfCode(text, at + 1, text[at] == 'x' ? 2 : 4);
  if (mark.fSize > 0) ++mark.fSize;
  return mark;
}

// "%20", also encoded twice: "%2520"
TMark MarkOfPercent(std::string_view text, std::size_t at) {
  std::size_t digits = at + 1;
  while (text.substr(digits, 2) == "25" && MarkOfCode(text, digits + 2, 2).fSize > 0) digits += 2;
  TMark const mark = MarkOfCode(text, digits, 2);
  return {mark.fSize == 0 ? 0 : digits + mark.fSize - at, mark.fIsNul};
}

// The mark at `at`, which belongs to no word.
TMark MarkAt(std::string_view text, std::size_t at) {
  std::size_t next = at;
  while (next < text.size() && text[next] == '\\') ++next;
  TMark mark;
  if (next > at) mark = MarkOfEscape(text, next);
  if (mark.fSize == 0 && next < text.size() && text[next] == '%') mark = MarkOfPercent(text, next);
  if (mark.fSize == 0 && next < text.size() && SizeOfWordCharacter(text, next) == 0)
    mark = {std::max<std::size_t>(FirstCharacterOf(text.substr(next)).fSize, 1), text[next] == '\0'};
  return {next - at + mark.fSize, mark.fIsNul};
}

}  // namespace

TNormalText::TNormalText(std::string_view text, std::size_t most) {
  fText.reserve(std::min(text.size(), most + 1));
  fEnds.reserve(std::min(text.size(), most + 1));
  for (std::size_t at = 0; at < text.size() && fText.size() <= most;) {
    std::size_t const end = EndOfWord(text, at);
    for (; at < end && fText.size() <= most; ++at) {
      fText += Lower(text[at]);
      fEnds.push_back(at + 1);
    }
    if (at == text.size() || fText.size() > most) break;
    TMark const mark = MarkAt(text, at);
    at += mark.fSize;
    fText += mark.fIsNul ? '\0' : '-';
    fEnds.push_back(at);
  }
}

bool TNormalText::HasWordEnd(std::size_t size) const {
  auto const isMark = [&](std::size_t at) { return fText[at] == '-' || fText[at] == '\0'; };
  return size > 0 && size <= fText.size() && !isMark(size - 1) && (size == fText.size() || isMark(size));
}

std::size_t TNormalText::LastWordEnd(std::size_t size) const {
  while (size > 0 && !HasWordEnd(size)) --size;
  return size;
}

std::string NormalWords(std::string_view text) {
  TNormalText const normal(text, text.size());
  std::size_t const begin = normal.Text().find_first_not_of(kMarks), end = normal.Text().find_last_not_of(kMarks);
  return begin == std::string_view::npos ? "" : std::string(normal.Text().substr(begin, end - begin + 1));
}

std::string FirstWordsOf(std::string const& normal, std::size_t most) {
  if (normal.size() <= most) return normal;
  std::size_t const mark = normal.find_last_of(kMarks, most);
  return normal.substr(0, mark == normal.npos ? normal.find_first_of(kMarks) : normal.find_last_not_of(kMarks, mark) + 1);
}

std::size_t SizeOfEscapeAt(std::string_view text, std::size_t at) {
  constexpr std::string_view oneLetter = "nrtbf";
  if (at == 0 || at >= text.size()) return 0;
  if (text[at - 1] == '%') return std::max<std::size_t>(MarkOfPercent(text, at - 1).fSize, 1) - 1;
  if (text[at - 1] != '\\') return 0;
  std::size_t const size = MarkOfEscape(text, at).fSize;
  return size == 0 && oneLetter.find(text[at]) != oneLetter.npos ? 1 : size;
}

}  // namespace NQRVZEP20
