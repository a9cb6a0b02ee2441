// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/UrlCoding.h"

#include <cctype>

namespace NQRVZEP20::zep {

namespace {

bool IsHexDigit(char c) { return std::isxdigit(static_cast<unsigned char>(c)) != 0; }

bool IsEscape(std::string_view text, std::size_t at) {
  return text[at] == '%' && at + 2 < text.size() && IsHexDigit(text[at + 1]) && IsHexDigit(text[at + 2]);
}

}  // namespace

bool IsUnreserved(char c) {
  return std::isalnum(static_cast<unsigned char>(c)) || std::string_view("-._~").find(c) != std::string_view::npos;
}

std::string Encoded(std::string_view text, std::string_view others) {
  constexpr char const* kDigits = "0123456789ABCDEF";
  std::string encoded;
  encoded.reserve(3 * text.size());  // a reallocation would leave a piece of a secret in freed memory
  for (char const c : text) {
    if (IsUnreserved(c) || others.find(c) != others.npos) {
      encoded += c;
      continue;
    }
    auto const byte = static_cast<unsigned char>(c);
    (encoded += '%') += kDigits[byte >> 4];
    encoded += kDigits[byte & 15];
  }
  return encoded;
}

std::string EncodedPath(std::string_view text) {
  std::string encoded;
  for (std::size_t i = 0; i < text.size(); ++i) {
    bool const isEscape = IsEscape(text, i);
    encoded += isEscape ? text.substr(i, 3) : Encoded(text.substr(i, 1), "/!$&'()*+,=:@");
    if (isEscape) i += 2;
  }
  return encoded;
}

std::string Decoded(std::string_view text) {
  std::string decoded;
  decoded.reserve(text.size());
  for (std::size_t i = 0; i < text.size(); ++i) {
    bool const isEscape = IsEscape(text, i);
    decoded += isEscape ? static_cast<char>(std::stoi(std::string(text.substr(i + 1, 2)), nullptr, 16)) : text[i];
    if (isEscape) i += 2;
  }
  return decoded;
}

}  // namespace NQRVZEP20::zep
