// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The begin of a text in a form that does not depend on case and on how marks are written: words in lower case, and '-' for each
// character between them, or '\0' for NUL. Such a character may be written as itself, after backslashes, percent-encoded, or as
// an escape such as "\x20" or "\u0020".
class TNormalText {
public:
  // Takes `most` characters and the next one.
  TNormalText(std::string_view text, std::size_t most);

  std::string_view Text() const { return fText; }

  // Whether a word ends after `size` characters, one to `most` of the constructor.
  bool HasWordEnd(std::size_t size) const;

  // The end of the last word that ends within `size` characters, up to `most`; 0 if none does.
  std::size_t LastWordEnd(std::size_t size) const;

  // The place in the text after `size` characters.
  std::size_t EndOf(std::size_t size) const { return size == 0 ? 0 : fEnds[size - 1]; }

private:
  std::string fText;
  std::vector<std::size_t> fEnds;
};

// The normal form of all words of a text, without the marks before and after them.
std::string NormalWords(std::string_view text);

// The first words of a normal form that begins with a word: as many as have `most` characters, but at least one.
std::string FirstWordsOf(std::string const& normal, std::size_t most);

// The size of an escape at the begin of a word, whose backslash or '%' precedes it: 2 of "20zx81" in "%20zx81"; 0 if there is
// none.
std::size_t SizeOfEscapeAt(std::string_view text, std::size_t at);

}  // namespace NQRVZEP20
