// SPDX-License-Identifier: Apache-2.0
#include "CpuInfo.h"

#include <algorithm>
#include <charconv>
#include <optional>

namespace NQRVZEP20 {

namespace {

std::string_view WithoutOuterBlanks(std::string_view text) {
  constexpr char const* blanks = " \t\r";
  std::size_t const first = text.find_first_not_of(blanks);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

std::optional<unsigned> NumberFrom(std::string_view text) {
  unsigned number = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  return error == std::errc() && end == text.data() + text.size() ? std::optional(number) : std::nullopt;
}

std::vector<std::string> WordsIn(std::string const& text) {
  std::vector<std::string> words;
  for (std::size_t at = 0; (at = text.find_first_not_of(' ', at)) != std::string::npos;) {
    std::size_t const end = std::min(text.find(' ', at), text.size());
    words.push_back(text.substr(at, end - at));
    at = end;
  }
  return words;
}

}  // namespace

TFinding<std::string> TCpuInfo::Text(std::string_view name) const {
  for (auto const& [found, value] : fValues)
    if (found == name && !value.empty()) return std::string(value);
  return TMissing{kMissingNotGiven, "/proc/cpuinfo contains no \"" + std::string(name) + "\""};
}

std::vector<std::string> TCpuInfo::Flags() const {
  for (char const* name : {"flags", "Features"})
    if (auto const text = Text(name)) return WordsIn(*text);
  return {};
}

bool TCpuInfo::HasFlag(std::string_view flag) const {
  auto const flags = Flags();
  return std::find(flags.begin(), flags.end(), flag) != flags.end();
}

std::vector<TCpuInfo> ParseCpuInfo(std::string_view text) {
  std::vector<TCpuInfo> cpus;
  while (!text.empty()) {
    std::string_view const line = text.substr(0, text.find('\n'));
    text.remove_prefix(std::min(line.size() + 1, text.size()));
    std::size_t const colon = line.find(':');
    if (colon == std::string_view::npos) continue;

    std::string_view const name = WithoutOuterBlanks(line.substr(0, colon)), value = WithoutOuterBlanks(line.substr(colon + 1));
    auto const number = name == "processor" ? NumberFrom(value) : std::nullopt;
    if (number)
      cpus.emplace_back(*number);
    else if (!cpus.empty())
      cpus.back().Add(name, value);
  }
  return cpus;
}

}  // namespace NQRVZEP20
