// SPDX-License-Identifier: Apache-2.0
#include "CpuList.h"

#include <charconv>

namespace NQRVZEP20 {

namespace {

constexpr unsigned kHighest = 65535;

// Reads a number at the start of the text and removes it.
bool TakeNumber(std::string_view& text, unsigned& number) {
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc() || number > kHighest) return false;
  text.remove_prefix(static_cast<std::size_t>(end - text.data()));
  return true;
}

// Removes a character at the start of the text, if it is there.
bool Take(std::string_view& text, char c) {
  if (text.empty() || text.front() != c) return false;
  text.remove_prefix(1);
  return true;
}

}  // namespace

std::vector<unsigned> CpusIn(std::string_view list) {
  std::vector<unsigned> cpus;
  do {
    unsigned first = 0, last = 0;
    if (!TakeNumber(list, first)) return {};
    last = first;
    if (Take(list, '-') && !TakeNumber(list, last)) return {};
    for (unsigned cpu = first; cpu <= last && cpus.size() <= kHighest; ++cpu) cpus.push_back(cpu);
  } while (Take(list, ','));
  return list.empty() ? cpus : std::vector<unsigned>();
}

std::string CpuListOf(std::vector<unsigned> const& cpus) {
  std::string list;
  for (std::size_t at = 0; at < cpus.size();) {
    std::size_t last = at;
    while (last + 1 < cpus.size() && cpus[last + 1] == cpus[last] + 1) ++last;
    list += (list.empty() ? "" : ",") + std::to_string(cpus[at]);
    if (last > at) list += "-" + std::to_string(cpus[last]);
    at = last + 1;
  }
  return list;
}

}  // namespace NQRVZEP20
