// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// Words of texts in UTF-8. A word is a run of letters, digits and other characters, except ASCII marks, and except spaces,
// quotes, punctuation and symbols of Unicode. Bytes that are not UTF-8 belong to no word.

inline bool IsLetterOrDigit(char byte) {
  return (byte >= '0' && byte <= '9') || (byte >= 'a' && byte <= 'z') || (byte >= 'A' && byte <= 'Z');
}

// The size of the character of a word at `at`; 0 if there is none.
std::size_t SizeOfWordCharacter(std::string_view text, std::size_t at);

inline char Lower(char byte) { return byte >= 'A' && byte <= 'Z' ? static_cast<char>(byte - 'A' + 'a') : byte; }
std::string Lower(std::string_view text);

// Whether it consists of hexadecimal digits; an empty text does not.
bool IsHex(std::string_view text);

// The bytes as hexadecimal digits in lower case.
std::string HexOf(std::string_view bytes);

// The words alone: "525400112201" for "52:54:00:11:22:01".
std::string Compact(std::string_view text);

// The end of the word that begins at `at`, or `at` if none does.
std::size_t EndOfWord(std::string_view text, std::size_t at);

// Whether no word continues across the two places: each is an end of the text, or beside a byte that belongs to no word.
bool IsWordBound(std::string_view text, std::size_t begin, std::size_t end);

// Whether the text is an IPv4 or IPv6 address, or a MAC address with colons or hyphens.
bool IsIPv4(std::string_view text);
bool IsIPv6(std::string_view text);
bool IsMac(std::string_view text);

// The addresses in a text, each as it is written there: MAC and IPv6 addresses, and if `withIPv4`, which looks like a version,
// IPv4 addresses, too.
std::vector<std::string> AddressesIn(std::string_view text, bool withIPv4);

// The UUIDs in a text: "root=UUID=12345678-1234-1234-1234-123456789012". The name of an EFI variable ends in one that is the same
// everywhere, after a hyphen; that one is omitted.
std::vector<std::string> UuidsIn(std::string_view text);

// The names of home directories in a text, and of the directories in which desktops mount the media of a user: "alice" for
// "/home/alice/bin" and "/run/media/alice/STICK".
std::vector<std::string> HomesIn(std::string_view text);

// The names of iSCSI initiators and targets in a text: "iqn.2026-01.net.example:disk1".
std::vector<std::string> IscsiNamesIn(std::string_view text);

}  // namespace NQRVZEP20
