// SPDX-License-Identifier: Apache-2.0
#pragma once

// The encodings in which a test looks for a secret, made without the library's own.

#include <nlohmann/json.hpp>

#include <cctype>
#include <cstdio>
#include <set>
#include <string>

namespace NQRVZEP20 {

inline std::string Lower(std::string text) {
  for (char& byte : text) byte = static_cast<char>(std::tolower(static_cast<unsigned char>(byte)));
  return text;
}

inline std::string HexOf(std::string const& bytes, std::string const& separator) {
  char digits[3];
  std::string text;
  for (unsigned char const byte : bytes) {
    std::snprintf(digits, sizeof digits, "%02x", byte);
    text += (text.empty() ? "" : separator) + digits;
  }
  return text;
}

// The characters of the base64 form that do not depend on the bytes before and after.
inline std::string Base64(std::string const& value, std::size_t skipped) {
  char const digits[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  std::string bits, text;
  for (unsigned char const byte : std::string(skipped, '\0') + value)
    for (int bit = 7; bit >= 0; --bit) bits += static_cast<char>('0' + (byte >> bit & 1));
  for (std::size_t at = (skipped * 8 + 5) / 6 * 6; at + 6 <= bits.size(); at += 6)
    text += digits[std::stoul(bits.substr(at, 6), nullptr, 2)];
  return text;
}

inline std::string Digits(std::string const& value) {
  std::string digits;
  for (char const byte : value)
    if (std::isxdigit(static_cast<unsigned char>(byte)) != 0) digits += byte;
  return digits;
}

inline std::string Reversed(std::string const& digits) {
  std::string reversed;
  for (std::size_t at = digits.size(); at >= 2; at -= 2) reversed += digits.substr(at - 2, 2);
  return reversed;
}

// Percent-encoded as in a URL.
inline std::string UrlOf(std::string const& value) {
  std::string text;
  for (unsigned char const byte : value) {
    bool const isPlain = std::isalnum(byte) != 0 || std::string("-._~").find(static_cast<char>(byte)) != std::string::npos;
    text += isPlain ? std::string(1, static_cast<char>(byte)) : "%" + HexOf({static_cast<char>(byte)}, "");
  }
  return text;
}

// With this mark in place of each of its own.
inline std::string WithMark(std::string text, char mark) {
  for (char& byte : text)
    if (std::isalnum(static_cast<unsigned char>(byte)) == 0) byte = mark;
  return text;
}

// The value in every encoding.
inline std::set<std::string> EncodingsOf(std::string const& value) {
  std::string wide;
  for (char const byte : value) wide += std::string(1, byte) + '\0';
  std::string percent;
  for (unsigned char const byte : value)
    percent += std::isalnum(byte) != 0 ? std::string(1, static_cast<char>(byte)) : "%" + HexOf({static_cast<char>(byte)}, "");
  std::string const json = nlohmann::json(value).dump();
  std::set<std::string> encodings = {value, json, nlohmann::json(json).dump(), wide, HexOf(wide, ""), percent, UrlOf(value)};
  for (char const mark : {'_', ' ', '.', ':'}) encodings.insert(WithMark(value, mark));
  for (char const* separator : {"", ":", "-", " "}) encodings.insert(HexOf(value, separator));
  if (value.size() >= 6)  // shorter values have base64 forms that are common words
    for (std::size_t skipped : {0, 1, 2}) encodings.insert(Base64(value, skipped));
  std::string const digits = Digits(value);
  if (digits.size() == 32)
    for (std::string const& order :
         {digits, Reversed(digits),
          Reversed(digits.substr(0, 8)) + Reversed(digits.substr(8, 4)) + Reversed(digits.substr(12, 4)) + digits.substr(16)}) {
      encodings.insert(order);
      encodings.insert(order.substr(0, 8) + "-" + order.substr(8, 4) + "-" + order.substr(12, 4) + "-" + order.substr(16, 4) +
                       "-" + order.substr(20));
    }
  if (digits.size() == 12)
    for (char const* separator : {"", ":", "-"}) {
      std::string grouped;
      for (std::size_t at = 0; at < 12; at += 2) grouped += (at == 0 ? "" : separator) + digits.substr(at, 2);
      encodings.insert(grouped);
    }
  return encodings;
}

}  // namespace NQRVZEP20
