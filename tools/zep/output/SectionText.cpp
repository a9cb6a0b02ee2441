// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/SectionText.h"

#include "tools/zep/output/Text.h"

#include <algorithm>
#include <numeric>

namespace NQRVZEP20::zep {

namespace {

constexpr std::size_t kLineWidth = 80;
constexpr std::size_t kColumnGap = 2;  // between two columns of a table

std::string CellText(TReportSection::TCell const& cell) {
  if (cell.IsKnown()) return *cell.fValue;
  return cell.IsNotApplicable() ? "none" : "unknown";
}

using TRows = std::vector<std::vector<std::string>>;

// The rows as texts, after the row of the columns' titles.
TRows TextRows(TReportSection const& section, std::size_t count) {
  TRows rows{section.fColumns};
  for (std::size_t at = 0; at < count; ++at) {
    rows.emplace_back();
    for (auto const& cell : section.fRows[at]) rows.back().push_back(CellText(cell));
  }
  return rows;
}

// The widths that the columns need; the widest give way until a row fits on a line.
std::vector<std::size_t> WidthsFor(TRows const& rows) {
  std::vector<std::size_t> widths(rows.front().size());
  for (auto const& row : rows)
    for (std::size_t at = 0; at < row.size(); ++at) widths[at] = std::max(widths[at], WidthOf(row[at]));
  std::size_t const room = kLineWidth - kColumnGap * (widths.size() - 1);
  while (std::accumulate(widths.begin(), widths.end(), std::size_t(0)) > room) --*std::max_element(widths.begin(), widths.end());
  return widths;
}

}  // namespace

std::string SectionAsText(TReportSection const& section, std::string const& label, std::size_t limit) {
  std::string const title = Printable(label + section.fTitle);
  if (section.fRows.empty())
    return Joined(Wrapped(title + ": none (" + Printable(section.fWhyEmpty) + ")", OutputWidth()), "\n") + "\n";

  std::size_t const count = limit == 0 ? section.fRows.size() : std::min(limit, section.fRows.size());
  TRows const rows = TextRows(section, count);
  TTable table(WidthsFor(rows), ENarrowTable::kBreaksWords);
  for (auto const& row : rows) table.Add(row);
  std::string const text = title + "\n" + table.GetText();
  if (count == section.fRows.size()) return text;
  return text + "and " + std::to_string(section.fRows.size() - count) + " more: zep report --section " + Printable(section.fKey) +
         "\n";
}

}  // namespace NQRVZEP20::zep
