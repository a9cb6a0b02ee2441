// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Spellings.h"

#include "collect/redaction/TNormalText.h"
#include "collect/redaction/Texts.h"

#include <arpa/inet.h>

namespace NQRVZEP20 {

namespace {

using TTexts = std::vector<std::string>;

constexpr std::size_t kShortestHex = 8, kUuidDigits = 32;
constexpr std::size_t kShortestBase64 = 6;  // fewer bytes have forms that are common words

// The digits with a mark after each group: "52-54-00" for a size of 2.
std::string Grouped(std::string_view digits, std::size_t size) {
  std::string text;
  for (std::size_t at = 0; at < digits.size(); at += size) {
    if (at > 0) text += '-';
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

// Each byte with the same text before it: "%52%54".
std::string Prefixed(std::string_view digits, std::string_view prefix) {
  std::string text;
  for (std::size_t at = 0; at < digits.size(); at += 2) text.append(prefix).append(digits.substr(at, 2));
  return text;
}

// The digits, also in groups of one, two and four bytes, and each byte as a number.
void AddHex(TTexts& texts, std::string const& digits) {
  texts.push_back(digits);
  texts.push_back("0x" + digits);
  for (std::size_t const size : {2, 4, 8}) texts.push_back(Grouped(digits, size));
  texts.push_back(Prefixed(digits, " 0x"));
}

// All characters as escapes, whether or not they need it.
void AddEscaped(TTexts& texts, std::string const& digits) {
  for (char const* prefix : {"%", "\\x", "\\u00"}) texts.push_back(Prefixed(digits, prefix));
}

void AddUuid(TTexts& texts, std::string const& digits) {
  texts.push_back(Grouped(digits, 8));
  for (std::string const& order :
       {digits,
        Reversed(digits.substr(0, 8)) + Reversed(digits.substr(8, 4)) + Reversed(digits.substr(12, 4)) + digits.substr(16),
        Reversed(digits)}) {
    AddHex(texts, order);
    texts.push_back(AsUuid(order));
  }
}

// The address as the kernel's tables write it, and in its other notations, also those of the domain name system.
void AddAddress(TTexts& texts, std::string const& value) {
  in6_addr bytes{};
  char notation[INET6_ADDRSTRLEN];
  if (::inet_pton(AF_INET, value.c_str(), &bytes) == 1) {
    std::string const digits = HexOf({reinterpret_cast<char const*>(&bytes), sizeof(in_addr)});
    texts.push_back(digits);
    texts.push_back(Reversed(digits));
    auto const* const bytesInOrder = reinterpret_cast<unsigned char const*>(&bytes);
    std::string name = "in-addr.arpa";
    for (std::size_t at = 0; at < sizeof(in_addr); ++at) name = std::to_string(bytesInOrder[at]) + "." + name;
    texts.push_back(name);
  } else if (::inet_pton(AF_INET6, value.c_str(), &bytes) == 1) {
    std::string const digits = HexOf({reinterpret_cast<char const*>(&bytes), sizeof bytes});
    texts.push_back(digits);
    texts.push_back(Grouped(digits, 4));
    std::string name = "ip6.arpa";
    for (char const digit : digits) name = std::string(1, digit) + "." + name;
    texts.push_back(name);
    texts.emplace_back(::inet_ntop(AF_INET6, &bytes, notation, sizeof notation));
  }
}

std::string Utf16(std::string_view value) {
  std::string text;
  for (char const byte : value) {
    text += byte;
    text += '\0';
  }
  return text;
}

// The same with the high byte first.
std::string Utf16BigEndian(std::string_view value) {
  std::string text;
  for (char const byte : value) {
    text += '\0';
    text += byte;
  }
  return text;
}

// "DC=example,DC=net" for "example.net", as directory services write it.
void AddDirectoryName(TTexts& texts, std::string_view value) {
  std::string name = "DC=";
  for (char const byte : value) name += byte == '.' ? ",DC=" : std::string(1, byte);
  if (value.find('.') != value.npos) texts.push_back(name);
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

// Letters beyond ASCII, which are a character each, become two marks and more.
std::string PercentEncoded(std::string_view value) {
  std::string text;
  for (char const byte : value) text += IsLetterOrDigit(byte) ? std::string(1, byte) : "%" + HexOf({&byte, 1});
  return text;
}

// "5000c500a1b2c3d4" of "naa.5000c500a1b2c3d4" and "wwn-0x5000c500a1b2c3d4"
std::string_view WithoutPrefix(std::string_view value) {
  for (std::string_view const prefix : {"wwn-", "naa.", "eui.", "0x"})
    if (Lower(value.substr(0, prefix.size())) == prefix) value.remove_prefix(prefix.size());
  return value;
}

// The hexadecimal digits of an identifier; empty if the value is none.
std::string DigitsOf(std::string_view value) {
  std::string digits = Lower(Compact(WithoutPrefix(value)));
  bool const isIdentifier = IsHex(digits) && digits.size() >= kShortestHex && digits.size() % 2 == 0 && !IsIPv4(value);
  return isIdentifier ? digits : "";
}

}  // namespace

std::vector<std::string> SpellingsOf(std::string_view value) {
  TTexts texts = {std::string(value), Lower(Compact(value)), PercentEncoded(value), Utf16(value), HexOf(Utf16(value))};
  AddHex(texts, HexOf(value));
  AddHex(texts, HexOf(Utf16BigEndian(value)));
  AddEscaped(texts, HexOf(value));
  AddDirectoryName(texts, value);
  std::string const digits = DigitsOf(value);
  if (!digits.empty()) AddHex(texts, digits);
  if (digits.size() == kUuidDigits) AddUuid(texts, digits);
  AddAddress(texts, std::string(value));
  return texts;
}

std::vector<std::string> Base64Of(std::string_view value) {
  TTexts texts;
  for (std::string const& bytes : {std::string(value), Utf16(value), Utf16BigEndian(value)})
    for (std::size_t skipped = 0; bytes.size() >= kShortestBase64 && skipped < 3; ++skipped)
      texts.push_back(Base64(bytes, skipped));
  return texts;
}

std::string CanonicalForm(std::string_view value) {
  constexpr std::size_t macDigits = 12, wwnDigits = 16;
  in6_addr bytes{};
  if (::inet_pton(AF_INET6, std::string(value).c_str(), &bytes) == 1)
    return HexOf({reinterpret_cast<char const*>(&bytes), sizeof bytes});
  std::string digits = DigitsOf(value);
  if (digits.size() == macDigits || digits.size() == wwnDigits || digits.size() == kUuidDigits) return digits;
  std::string const words = NormalWords(value);
  return words.empty() ? std::string(value) : words;
}

}  // namespace NQRVZEP20
