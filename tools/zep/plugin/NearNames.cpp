// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/NearNames.h"

#include "CIMNames.h"

#include <algorithm>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kMostNames = 5;

// The least number of letters to insert, remove or replace that makes one text of the other.
std::size_t DistanceOf(std::string const& a, std::string const& b) {
  std::vector<std::size_t> row(b.size() + 1);  // the distances of the beginnings of b from a beginning of a
  for (std::size_t j = 0; j <= b.size(); ++j) row[j] = j;
  for (std::size_t i = 1; i <= a.size(); ++i) {
    std::size_t diagonal = std::exchange(row[0], i);
    for (std::size_t j = 1; j <= b.size(); ++j) {
      std::size_t const replaced = diagonal + (a[i - 1] == b[j - 1] ? 0 : 1);
      diagonal = row[j];
      row[j] = std::min({replaced, row[j] + 1, row[j - 1] + 1});
    }
  }
  return row[b.size()];
}

}  // namespace

std::vector<std::string> NearNames(std::string const& wrong, std::vector<std::string> const& names) {
  std::string const folded = FoldName(wrong);
  std::size_t const most = std::max<std::size_t>(2, folded.size() / 4);
  std::vector<std::pair<std::size_t, std::string>> near;
  for (std::string const& name : names) {
    std::string const other = FoldName(name);
    std::size_t const distance = DistanceOf(folded, other);
    if (distance <= most || other.find(folded) != other.npos) near.emplace_back(distance, name);
  }
  std::sort(near.begin(), near.end());
  near.resize(std::min(near.size(), kMostNames));

  std::vector<std::string> nearest;
  for (auto const& [distance, name] : near) nearest.push_back(name);
  return nearest;
}

}  // namespace NQRVZEP20::zep
