// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Texts.h"

#include "collect/SafeText.h"

#include <arpa/inet.h>

#include <algorithm>

namespace NQRVZEP20 {

namespace {

// Blocks of Unicode without letters: spaces, quotes, punctuation, arrows, symbols, and the byte order mark.
bool IsMark(std::uint32_t code) {
  constexpr std::uint32_t blocks[][2] = {{0x80, 0xbf},     {0xd7, 0xd7},     {0xf7, 0xf7},     {0x2000, 0x206f},
                                         {0x2190, 0x2bff}, {0x2e00, 0x2e7f}, {0x3000, 0x3003}, {0x3008, 0x3020},
                                         {0xfe30, 0xfe6f}, {0xfeff, 0xff0f}};
  return std::any_of(std::begin(blocks), std::end(blocks),
                     [&](auto const& block) { return code >= block[0] && code <= block[1]; });
}

// Whether the character that ends at `end` belongs to a word.
bool IsWordBefore(std::string_view text, std::size_t end) {
  constexpr std::size_t longest = 4;
  if (end == 0) return false;
  if (static_cast<unsigned char>(text[end - 1]) < 0x80) return IsLetterOrDigit(text[end - 1]);
  for (std::size_t size = 2; size <= std::min(longest, end); ++size)
    if (SizeOfWordCharacter(text.substr(0, end), end - size) == size) return true;
  return false;
}

bool IsAddress(int family, std::string_view text) {
  in6_addr address;
  bool const hasMarks = std::count(text.begin(), text.end(), family == AF_INET ? '.' : ':') >= 2;
  return hasMarks && text.size() < INET6_ADDRSTRLEN && ::inet_pton(family, std::string(text).c_str(), &address) == 1;
}

bool IsHexDigit(char byte) { return (byte >= '0' && byte <= '9') || (Lower(byte) >= 'a' && Lower(byte) <= 'f'); }

bool IsAddressByte(char byte) { return IsHexDigit(byte) || byte == ':' || byte == '.' || byte == '-'; }

// Without the marks that end a sentence or a name: "192.0.2.1." and "eth0: 52:54:...:" keep only the address.
std::string_view WithoutMarks(std::string_view text) {
  while (!text.empty() && (text.back() == '.' || text.back() == '-')) text.remove_suffix(1);
  while (!text.empty() && (text.front() == '.' || text.front() == '-')) text.remove_prefix(1);
  bool const endsInColon = text.size() > 1 && text.back() == ':' && text[text.size() - 2] != ':';
  return endsInColon ? text.substr(0, text.size() - 1) : text;
}

// The addresses in a run of address bytes that is none as a whole: "192.0.2.1:80", "192.0.2.1-192.0.2.9", and the two MAC
// addresses at the begin of the header of a frame, as the kernel's packet filter logs it.
void AddParts(std::string_view text, std::size_t begin, std::size_t end, bool withIPv4, std::vector<std::string>& addresses) {
  constexpr std::size_t mac = 17, header = 41;
  std::string_view const first = text.substr(begin, mac), second = text.substr(std::min(begin + mac + 1, text.size()), mac);
  if (end - begin == header && IsMac(first) && IsMac(second)) {
    addresses.emplace_back(first);
    addresses.emplace_back(second);
  }
  for (std::size_t at = begin; withIPv4 && at < end;) {
    std::size_t const partEnd = std::min(text.substr(0, end).find_first_of(":-", at), end);
    std::string_view const part = WithoutMarks(text.substr(at, partEnd - at));
    if (IsIPv4(part) && IsWordBound(text, at, partEnd)) addresses.emplace_back(part);
    at = partEnd + 1;
  }
}

// The end of the name of an account that begins at `at`.
std::size_t EndOfName(std::string_view text, std::size_t at) {
  constexpr std::string_view marks = "._-@+$\\";
  std::size_t const begin = at;
  while (at < text.size()) {
    std::size_t const size = SizeOfWordCharacter(text, at);
    if (size == 0 && marks.find(text[at]) == marks.npos) break;
    at += std::max<std::size_t>(size, 1);
  }
  while (at > begin && text[at - 1] == '.') --at;  // the end of a sentence
  return at;
}

}  // namespace

std::string Lower(std::string_view text) {
  std::string lower(text);
  for (char& byte : lower) byte = Lower(byte);
  return lower;
}

bool IsHex(std::string_view text) { return !text.empty() && std::all_of(text.begin(), text.end(), IsHexDigit); }

std::string HexOf(std::string_view bytes) {
  constexpr char digits[] = "0123456789abcdef";
  std::string hex;
  for (char const byte : bytes) {
    auto const number = static_cast<unsigned char>(byte);
    hex += digits[number >> 4];
    hex += digits[number & 15];
  }
  return hex;
}

std::size_t SizeOfWordCharacter(std::string_view text, std::size_t at) {
  if (at >= text.size()) return 0;
  if (static_cast<unsigned char>(text[at]) < 0x80) return IsLetterOrDigit(text[at]) ? 1 : 0;
  TCharacter const character = FirstCharacterOf(text.substr(at));
  return character.fSize == 0 || IsMark(character.fCode) ? 0 : character.fSize;
}

std::string Compact(std::string_view text) {
  std::string compact;
  for (std::size_t at = 0; at < text.size();) {
    std::size_t const end = EndOfWord(text, at);
    compact += text.substr(at, end - at);
    at = end + 1;
  }
  return compact;
}

std::size_t EndOfWord(std::string_view text, std::size_t at) {
  std::size_t size = 0;
  do {
    while (at < text.size() && IsLetterOrDigit(text[at])) ++at;
    size = SizeOfWordCharacter(text, at);
    at += size;
  } while (size > 0);
  return at;
}

bool IsWordBound(std::string_view text, std::size_t begin, std::size_t end) {
  return !IsWordBefore(text, begin) && SizeOfWordCharacter(text, end) == 0;
}

bool IsIPv4(std::string_view text) { return IsAddress(AF_INET, text); }

bool IsIPv6(std::string_view text) { return IsAddress(AF_INET6, text); }

bool IsMac(std::string_view text) {
  constexpr std::size_t length = 17;
  if (text.size() != length || (text[2] != ':' && text[2] != '-')) return false;
  for (std::size_t at = 0; at < length; ++at)
    if (at % 3 == 2 ? text[at] != text[2] : !IsHexDigit(text[at])) return false;
  return true;
}

std::vector<std::string> AddressesIn(std::string_view text, bool withIPv4) {
  constexpr std::size_t shortest = 3;  // "::1"
  std::vector<std::string> addresses;
  bool const hasMarks = std::count(text.begin(), text.end(), ':') >= 2 || std::count(text.begin(), text.end(), '-') >= 5;
  if (!withIPv4 && !hasMarks) return addresses;
  for (std::size_t at = 0; at < text.size();) {
    std::size_t end = at;
    while (end < text.size() && IsAddressByte(text[end])) ++end;
    if (end - at < shortest) {
      at = end + 1;
      continue;
    }
    std::string_view const token = WithoutMarks(text.substr(at, end - at));
    bool const isWhole = IsWordBound(text, at, end);
    if (isWhole && (IsMac(token) || IsIPv6(token) || (withIPv4 && IsIPv4(token))))
      addresses.emplace_back(token);
    else
      AddParts(text, at, end, withIPv4, addresses);
    at = end + 1;
  }
  return addresses;
}

std::vector<std::string> UuidsIn(std::string_view text) {
  constexpr std::size_t length = 36;
  auto const isUuid = [](std::string_view token) {
    for (std::size_t at = 0; at < length; ++at) {
      bool const isHyphen = at == 8 || at == 13 || at == 18 || at == 23;
      if (isHyphen ? token[at] != '-' : !IsHexDigit(token[at])) return false;
    }
    return true;
  };
  std::vector<std::string> uuids;
  for (std::size_t at = 0; at + length <= text.size(); ++at) {
    if (!IsWordBound(text, at, at + length) || (at > 0 && text[at - 1] == '-') || !isUuid(text.substr(at, length))) continue;
    uuids.emplace_back(text.substr(at, length));
    at += length;
  }
  return uuids;
}

std::vector<std::string> HomesIn(std::string_view text) {
  constexpr std::string_view home = "/home/", media = "/media/";
  std::vector<std::string> names;
  for (std::string_view const parent : {home, media})
    for (std::size_t at = 0; (at = text.find(parent, at)) != text.npos;) {
      at += parent.size();
      std::size_t const end = EndOfName(text, at);
      bool const isHome = parent == home || (end < text.size() && text[end] == '/');
      if (end > at && isHome) names.emplace_back(text.substr(at, end - at));
    }
  return names;
}

std::vector<std::string> IscsiNamesIn(std::string_view text) {
  constexpr std::string_view begin = "iqn.", unit = "-lun-";
  std::vector<std::string> names;
  for (std::size_t at = 0; (at = text.find(begin, at)) != text.npos;) {
    std::size_t end = at + begin.size();
    while (end < text.size() && (IsLetterOrDigit(text[end]) || text[end] == '.' || text[end] == ':' || text[end] == '-')) ++end;
    std::string_view name = text.substr(at, end - at);
    name = name.substr(0, name.find(unit));
    while (!IsLetterOrDigit(name.back())) name.remove_suffix(1);
    if (name.size() > begin.size() && IsWordBound(text, at, at + name.size())) names.emplace_back(name);
    at = end;
  }
  return names;
}

}  // namespace NQRVZEP20
