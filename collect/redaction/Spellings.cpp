// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Spellings.h"

#include "collect/redaction/Texts.h"

#include <arpa/inet.h>

#include <algorithm>

namespace NQRVZEP20 {

namespace {

using TTexts = std::vector<std::string>;

constexpr std::size_t kShortestHex = 8, kUuidDigits = 32;
constexpr std::size_t kShortestBase64 = 6;  // shorter values have forms that are common words

// The digits with a separator after each group: "52:54:00" for a size of 2.
std::string Grouped(std::string_view digits, std::size_t size, char separator) {
  std::string text;
  for (std::size_t at = 0; at < digits.size(); at += size) {
    if (at > 0) text += separator;
    text += digits.substr(at, size);
  }
  return text;
}

// "12345678-1234-1234-1234-123456789012"
std::string AsUuid(std::string const& digits) {
  return digits.substr(0, 8) + "-" + digits.substr(8, 4) + "-" + digits.substr(12, 4) + "-" + digits.substr(16, 4) + "-" +
         digits.substr(20);
}

// The digits with the order of their bytes reversed.
std::string Reversed(std::string_view digits) {
  std::string reversed;
  for (std::size_t at = digits.size(); at >= 2; at -= 2) reversed += digits.substr(at - 2, 2);
  return reversed;
}

void AddHex(TTexts& texts, std::string const& digits) {
  texts.push_back(digits);
  texts.push_back("0x" + digits);
  for (char const separator : {':', '-', ' '}) texts.push_back(Grouped(digits, 2, separator));
  texts.push_back(Grouped(digits, 4, '.'));
}

void AddUuid(TTexts& texts, std::string const& digits) {
  texts.push_back(Grouped(digits, 8, ':'));
  for (std::string const& order :
       {digits,
        Reversed(digits.substr(0, 8)) + Reversed(digits.substr(8, 4)) + Reversed(digits.substr(12, 4)) + digits.substr(16),
        Reversed(digits)}) {
    AddHex(texts, order);
    texts.push_back(AsUuid(order));
  }
}

// The address as the kernel's tables write it, and in its other notations.
void AddAddress(TTexts& texts, std::string const& value) {
  in6_addr bytes{};
  char notation[INET6_ADDRSTRLEN];
  if (::inet_pton(AF_INET, value.c_str(), &bytes) == 1) {
    std::string const digits = HexOf({reinterpret_cast<char const*>(&bytes), sizeof(in_addr)});
    texts.push_back(digits);
    texts.push_back(Reversed(digits));
  } else if (::inet_pton(AF_INET6, value.c_str(), &bytes) == 1) {
    std::string const digits = HexOf({reinterpret_cast<char const*>(&bytes), sizeof bytes});
    texts.push_back(digits);
    texts.push_back(Grouped(digits, 4, ':'));
    texts.emplace_back(::inet_ntop(AF_INET6, &bytes, notation, sizeof notation));
  }
}

std::string Utf16(std::string_view value, bool isBigEndian) {
  std::string text;
  for (char const byte : value) {
    if (isBigEndian) text += '\0';
    text += byte;
    if (!isBigEndian) text += '\0';
  }
  return text;
}

// The characters of the base64 form that depend on the value alone, where `skipped` bytes precede it.
std::string Base64(std::string_view value, std::size_t skipped) {
  constexpr char digits[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  std::string const bytes = std::string(skipped, '\0') + std::string(value);
  std::size_t const first = (skipped * 8 + 5) / 6, last = bytes.size() * 8 / 6;
  std::string text;
  for (std::size_t digit = first; digit < last; ++digit) {
    std::size_t const bit = digit * 6, at = bit / 8;
    unsigned const high = static_cast<unsigned char>(bytes[at]);
    unsigned const low = at + 1 < bytes.size() ? static_cast<unsigned char>(bytes[at + 1]) : 0U;
    text += digits[((high << 8 | low) >> (10 - bit % 8)) & 63];
  }
  return text;
}

std::string PercentEncoded(std::string_view value) {
  std::string text;
  for (char const byte : value) text += IsLetterOrDigit(byte) ? std::string(1, byte) : "%" + HexOf({&byte, 1});
  return text;
}

std::string WithEscapes(std::string_view value) {
  std::string text;
  for (char const byte : value) {
    if (byte == '"' || byte == '\\') text += '\\';
    text += byte;
  }
  return text;
}

void AddEncodings(TTexts& texts, std::string_view value) {
  std::string const hex = HexOf(value);
  AddHex(texts, hex);
  texts.push_back(HexOf(Utf16(value, false)));
  texts.push_back(Utf16(value, false));
  texts.push_back(Utf16(value, true));
  if (value.size() >= kShortestBase64)
    for (std::size_t skipped = 0; skipped < 3; ++skipped) texts.push_back(Base64(value, skipped));
  texts.push_back(PercentEncoded(value));
  texts.push_back(WithEscapes(value));
}

}  // namespace

std::vector<std::string> SpellingsOf(std::string_view value) {
  TTexts texts = {std::string(value)};
  AddEncodings(texts, value);
  std::string const digits = Lower(Compact(value));
  if (digits != value) texts.push_back(digits);
  if (IsHex(digits) && digits.size() >= kShortestHex && digits.size() % 2 == 0 && !IsIPv4(value)) AddHex(texts, digits);
  if (IsHex(digits) && digits.size() == kUuidDigits) AddUuid(texts, digits);
  AddAddress(texts, std::string(value));
  for (std::string& text : texts) text = Lower(text);
  TTexts different;
  for (std::string& text : texts)
    if (std::find(different.begin(), different.end(), text) == different.end()) different.push_back(std::move(text));
  return different;
}

}  // namespace NQRVZEP20
