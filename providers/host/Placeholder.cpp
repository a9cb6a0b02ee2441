// SPDX-License-Identifier: Apache-2.0
#include "Placeholder.h"

#include <algorithm>
#include <cctype>

namespace NQRVZEP20 {

namespace {

// In lower case.
constexpr std::string_view kPlaceholders[] = {
    "to be filled by o.e.m.",
    "to be filled by o.e.m",
    "to be filled by oem",
    "to be filled",
    "default string",
    "default",
    "not specified",
    "not applicable",
    "not available",
    "not present",
    "not provided",
    "not settable",
    "not set",
    "no information",
    "unknown",
    "undefined",
    "unspecified",
    "invalid",
    "none",
    "(none)",
    "null",
    "n/a",
    "na",
    "o.e.m.",
    "oem",
    "empty",
    "<empty>",
    "[empty]",
    "system manufacturer",
    "system product name",
    "system name",
    "system version",
    "system serial number",
    "system uuid",
    "system sku",
    "system sku number",
    "sku",
    "sku number",
    "serial number",
    "chassis manufacturer",
    "chassis manufacture",
    "chassis version",
    "chassis serial number",
    "asset tag",
    "asset-1234567890",
    "no asset tag",
    "no asset information",
    "no dimm",
    "123456789",
    "1234567890",
    "0123456789",
    "0123456789abcdef",
    "part number",
    "03000200-0400-0500-0006-000700080009",
};

// Followed by the number of the memory slot: "Manufacturer0", "PartNum3".
constexpr std::string_view kNumberedPlaceholders[] = {
    "manufacturer",    "partnum",   "sernum",         "assettagnum",       "modulepartnumber",
    "a1_manufacturer", "a1_sernum", "a1_assettagnum", "array1_partnumber",
};

constexpr std::string_view kFillers = "0x-.*_#?f";  // a row of four or more of one of these is a placeholder
constexpr std::size_t kShortestRow = 4;

std::string Lower(std::string_view text) {
  std::string lower(text);
  std::transform(lower.begin(), lower.end(), lower.begin(), [](unsigned char c) { return std::tolower(c); });
  return lower;
}

// True for control characters, too, such as those of a line end.
bool IsBlank(char c) { return (c >= 0 && c <= ' ') || c == '\x7f'; }

std::string_view WithoutOuterBlanks(std::string_view text) {
  while (!text.empty() && IsBlank(text.front())) text.remove_prefix(1);
  while (!text.empty() && IsBlank(text.back())) text.remove_suffix(1);
  return text;
}

bool HasOnly(std::string_view text, char c) { return !text.empty() && text.find_first_not_of(c) == std::string_view::npos; }

template <std::size_t N>
bool IsOneOf(std::string_view const (&list)[N], std::string_view text) {
  return std::find(std::begin(list), std::end(list), text) != std::end(list);
}

bool IsNumberedPlaceholder(std::string_view text) {
  std::size_t const digits = text.find_last_not_of("0123456789") + 1;
  return digits < text.size() && IsOneOf(kNumberedPlaceholders, text.substr(0, digits));
}

bool IsRowOfFillers(std::string_view text) {
  return text.size() >= kShortestRow && kFillers.find(text[0]) != std::string_view::npos &&
         text.find_first_not_of(text[0]) == std::string_view::npos;
}

}  // namespace

bool IsPlaceholder(std::string_view text) {
  std::string const lower = Lower(WithoutOuterBlanks(text));
  return IsOneOf(kPlaceholders, lower) || IsNumberedPlaceholder(lower) || IsRowOfFillers(lower) || HasOnly(lower, '-');
}

TFinding<std::string> HostNameOf(std::string const& nodeName) {
  if (nodeName.empty()) return TMissing{kMissingNotGiven, "the kernel reports an empty host name"};
  if (nodeName == "(none)")
    return TMissing{kMissingPlaceholder, "placeholder text of the kernel: \"(none)\"; no host name is set"};
  return nodeName;
}

TFinding<std::string> WithoutPlaceholder(std::string const& text) {
  if (WithoutOuterBlanks(text).empty()) return TMissing{kMissingNotGiven, "the firmware reports only blanks"};
  if (HasOnly(WithoutOuterBlanks(text), '\xff'))  // flash memory that was never written
    return TMissing{kMissingNotGiven, "not programmed in the firmware's table (0xFF)"};
  if (IsPlaceholder(text)) return TMissing{kMissingPlaceholder, "placeholder text of the firmware: \"" + text + "\""};
  return text;
}

}  // namespace NQRVZEP20
