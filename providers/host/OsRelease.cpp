// SPDX-License-Identifier: Apache-2.0
#include "OsRelease.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

constexpr char const* kFiles[] = {"/etc/os-release", "/usr/lib/os-release"};

// The text up to the closing quote, or to its end without one. Within double quotes, a backslash escapes the characters that are
// special to the shell.
std::string Unquoted(std::string_view text) {
  char const quote = text.empty() ? '\0' : text[0];
  if (quote != '"' && quote != '\'') return std::string(text.substr(0, text.find_last_not_of(" \t\r") + 1));
  std::string value;
  for (std::size_t at = 1; at < text.size() && text[at] != quote; ++at) {
    bool const isEscape = quote == '"' && text[at] == '\\' && at + 1 < text.size() &&
                          std::string_view("\"\\$`").find(text[at + 1]) != std::string_view::npos;
    if (isEscape) ++at;
    value += text[at];
  }
  return value;
}

}  // namespace

std::map<std::string, std::string> ParseOsRelease(std::string_view text) {
  std::map<std::string, std::string> values;
  while (!text.empty()) {
    std::size_t const end = text.find('\n');
    std::string_view line = text.substr(0, end);
    text = end == std::string_view::npos ? std::string_view() : text.substr(end + 1);

    line.remove_prefix(std::min(line.find_first_not_of(" \t"), line.size()));
    std::size_t const equals = line.find('=');
    if (line.empty() || line[0] == '#' || equals == std::string_view::npos) continue;
    values[std::string(line.substr(0, equals))] = Unquoted(line.substr(equals + 1));
  }
  return values;
}

TOsRelease TOsRelease::ReadFrom(TMachineFiles const& files) {
  for (char const* name : kFiles)
    if (auto const text = files.Content(name)) return TOsRelease(name, *text);
  return TOsRelease("", "");
}

TFinding<std::string> TOsRelease::Value(std::initializer_list<char const*> names) const {
  if (fFile.empty()) return TMissing{kMissingUnreadable, "neither /etc/os-release nor /usr/lib/os-release can be read"};
  for (char const* name : names) {
    auto const found = fValues.find(name);
    if (found != fValues.end() && !found->second.empty()) return found->second;
  }
  return TMissing{kMissingNotGiven, fFile + " contains no " + *names.begin()};
}

}  // namespace NQRVZEP20
