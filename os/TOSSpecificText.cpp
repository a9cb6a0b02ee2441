// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include <algorithm>

namespace NQRVZEP20 {

bool TOSSpecific::removeNonAlpaNumeric(std::string& text) {
  if (std::size_t const open = text.find('['); open != std::string::npos) text.erase(0, open + 1);
  if (std::size_t const close = text.find(']'); close != std::string::npos) text.erase(close);
  return true;
}

bool TOSSpecific::breakApartVersion(std::string& tail, std::string& head) {
  std::size_t const first = tail.find('-');
  if (first == std::string::npos) return true;
  std::size_t const second = tail.find('-', first + 1);
  std::size_t const cut = second == std::string::npos ? first : second;
  head = tail.substr(0, cut);
  tail.erase(0, cut + 1);
  return true;
}

std::vector<std::string> TOSSpecific::multiStringTok(char* buffer, unsigned long length, char separator) {
  std::vector<std::string> strings;
  if (length < 2) return strings;
  // A string that ends at or after this mark is dropped, so no byte from the mark on is read.
  char const* const endMark = buffer + length - 2;
  char const* start = buffer;
  strings.reserve(8);  // more than most sets have
  for (char const* end = std::find(start, endMark, separator); end != endMark; end = std::find(start, endMark, '\0')) {
    strings.emplace_back(start, end);
    start = end + 1;
  }
  return strings;
}

}  // namespace NQRVZEP20
