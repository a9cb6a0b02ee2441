// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Texts.h"

#include <arpa/inet.h>

#include <algorithm>

namespace NQRVZEP20 {

namespace {

bool IsAddress(int family, std::string_view text) {
  in6_addr address;
  return text.size() < INET6_ADDRSTRLEN && ::inet_pton(family, std::string(text).c_str(), &address) == 1;
}

bool IsAddressByte(char byte) { return IsHex({&byte, 1}) || byte == ':' || byte == '.' || byte == '-'; }

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
    std::size_t const partEnd = std::min(text.find_first_of(":-", at), end);
    std::string_view const part = WithoutMarks(text.substr(at, partEnd - at));
    if (IsIPv4(part) && IsWordBound(text, at, partEnd)) addresses.emplace_back(part);
    at = partEnd + 1;
  }
}

}  // namespace

std::string Lower(std::string_view text) {
  std::string lower(text);
  for (char& byte : lower) byte = Lower(byte);
  return lower;
}

bool IsHex(std::string_view text) { return !text.empty() && text.find_first_not_of("0123456789abcdefABCDEF") == text.npos; }

std::string Compact(std::string_view text) {
  std::string compact;
  std::copy_if(text.begin(), text.end(), std::back_inserter(compact), IsWordByte);
  return compact;
}

std::size_t EndOfWord(std::string_view text, std::size_t at) {
  while (at < text.size() && IsWordByte(text[at])) ++at;
  return at;
}

bool IsWordBound(std::string_view text, std::size_t begin, std::size_t end) {
  return (begin == 0 || !IsWordByte(text[begin - 1])) && (end == text.size() || !IsWordByte(text[end]));
}

bool IsIPv4(std::string_view text) { return IsAddress(AF_INET, text); }

bool IsIPv6(std::string_view text) { return IsAddress(AF_INET6, text); }

bool IsMac(std::string_view text) {
  constexpr std::size_t length = 17;
  if (text.size() != length || (text[2] != ':' && text[2] != '-')) return false;
  for (std::size_t at = 0; at < length; ++at)
    if (at % 3 == 2 ? text[at] != text[2] : !IsHex(text.substr(at, 1))) return false;
  return true;
}

std::vector<std::string> AddressesIn(std::string_view text, bool withIPv4) {
  std::vector<std::string> addresses;
  for (std::size_t at = 0; at < text.size();) {
    std::size_t end = at;
    while (end < text.size() && IsAddressByte(text[end])) ++end;
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
      if (isHyphen ? token[at] != '-' : !IsHex(token.substr(at, 1))) return false;
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
  constexpr std::string_view home = "/home/";
  std::vector<std::string> names;
  for (std::size_t at = 0; (at = text.find(home, at)) != text.npos;) {
    at += home.size();
    std::size_t const end = std::min(text.find_first_of("/ :\"',;)", at), text.size());
    if (end > at) names.emplace_back(text.substr(at, end - at));
  }
  return names;
}

}  // namespace NQRVZEP20
