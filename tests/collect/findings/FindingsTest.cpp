// SPDX-License-Identifier: Apache-2.0

// The tables of docs/findings.md against the rules and the thresholds.

#include "collect/findings/Findings.h"
#include "tests/Support.h"

#include <gmock/gmock.h>

#include <map>
#include <regex>
#include <set>

namespace NQRVZEP20 {
namespace {

// The first two columns of the table below the heading.
std::map<std::string, std::string> TableBelow(std::string const& heading) {
  std::string const page = ReadFile(SourcePath("docs/findings.md"));
  std::size_t const begin = page.find("\n## " + heading + "\n");
  if (begin == std::string::npos) return {};
  std::string const section = page.substr(begin, page.find("\n## ", begin + 1) - begin);
  std::regex const row("\n\\| `([a-z-]+)` \\| ([^|]*) \\|");
  std::map<std::string, std::string> rows;
  for (std::sregex_iterator match(section.begin(), section.end(), row), end; match != end; ++match)
    rows[(*match)[1]] = (*match)[2];
  return rows;
}

TEST(FindingsTest, TheTableHasEveryRule) {
  std::set<std::string> rules, rows;
  for (TRule const& rule : StandardRules()) rules.insert(rule.fId);
  for (auto const& [id, finds] : TableBelow("Rules")) rows.insert(id);
  EXPECT_EQ(rows, rules);
}

TEST(FindingsTest, TheTableHasEveryThresholdWithItsDefault) {
  std::map<std::string, std::string> thresholds;
  for (auto const& [key, value] : TThresholds().Settings()) thresholds[key] = std::to_string(value);
  EXPECT_EQ(TableBelow("Thresholds"), thresholds);
}

}  // namespace
}  // namespace NQRVZEP20
