// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/html/ReportHtml.h"

#include "MissingValueClass.h"
#include "collect/stored/ObjectName.h"
#include "tools/zep/html/Html.h"
#include "tools/zep/output/FindingsText.h"

#include <string.h>

#include <algorithm>
#include <cstdio>
#include <map>

namespace NQRVZEP20::zep {

namespace {

using TText = TAnswer<std::string>;

// ---- Parts of a page ----

// A card whose contents the reader can fold. `id` is the target of the table of contents.
std::string Card(std::string const& id, std::string const& title, std::string const& contents, bool isOpen = true) {
  return "<section class=\"card\" id=\"" + Html(id) + "\"><details" + (isOpen ? " open" : "") + "><summary>" +
         Element("span", "class=\"h2\" role=\"heading\" aria-level=\"2\"", title) + "</summary>\n" + contents +
         "</details></section>\n";
}

std::string Missing(TMissing const& missing) {
  bool const isNone = missing.fCode == kMissingNotApplicable;
  return Element("span", "class=\"none\"", (isNone ? "none: " : "unknown: ") + missing.fReason);
}

std::string Cell(TText const& answer) {
  if (!answer.IsKnown()) return Missing(answer.fMissing);
  return Html(*answer.fValue) + (answer.fNote.empty() ? "" : " (" + Html(answer.fNote) + ")");
}

// `rows` is HTML. The table scrolls by itself on a narrow screen, also with the keyboard.
std::string Table(std::string const& title, std::vector<std::string> const& columns, std::string const& rows) {
  std::string head;
  for (std::string const& column : columns) head += Element("th", "scope=\"col\"", column);
  return "<div class=\"scroll\" role=\"region\" tabindex=\"0\" aria-label=\"" + Html(title) + "\"><table><thead><tr>" + head +
         "</tr></thead>\n<tbody>\n" + rows + "</tbody></table></div>\n";
}

std::string RowWith(std::vector<std::string> const& cells) {
  std::string row = "<tr>";
  for (std::string const& cell : cells)
    row += cells.data() == &cell ? "<th scope=\"row\">" + cell + "</th>" : "<td>" + cell + "</td>";
  return row + "</tr>\n";
}

// ---- Findings ----

template <class TIs>
std::size_t CountRules(TStoredReport const& report, TIs const& is) {
  return static_cast<std::size_t>(std::count_if(report.fRules.begin(), report.fRules.end(), is));
}

std::size_t RulesNotAsked(TStoredReport const& report) {
  return CountRules(report, [](TStoredRule const& rule) { return rule.fOutcome == "not-asked"; });
}

std::string Verdict(TStoredReport const& report) {
  bool const isAllAsked = RulesNotAsked(report) == 0, hasNone = report.fProblems.empty();
  if (hasNone && isAllAsked) return "<p class=\"verdict fine\">No problem was found</p>\n";
  if (hasNone) return "<p class=\"verdict\">No problem was found by the rules that could be asked</p>\n";
  return Element("p", "class=\"verdict " + Html(report.fProblems.front().fSeverity) + "\"", CountsOf(report.fProblems)) + "\n";
}

std::string Problem(TStoredProblem const& problem) {
  std::string html = "<li class=\"" + Html(problem.fSeverity) + "\">" + Element("span", "class=\"severity\"", problem.fSeverity) +
                     Element("p", "class=\"what\"", problem.fReason);
  if (!problem.fRemedy.empty()) html += Element("p", problem.fRemedy);
  return html + Element("span", "class=\"soft\"", problem.fRule) + "</li>\n";
}

std::string Answer(TStoredRule const& rule) {
  if (rule.fHasNothingToExamine) return Element("span", "class=\"none\"", "nothing to examine");
  if (rule.fOutcome == "fine") return Element("span", "class=\"fine\"", "no");
  if (rule.fOutcome == "wrong") return Element("span", "class=\"error\"", "yes");
  if (rule.fNotExamined.empty()) return Element("span", "class=\"none\"", "unknown");
  return Missing({"", rule.fNotExamined.front().fReason});
}

std::string Rules(TStoredReport const& report) {
  std::string rows;
  for (TStoredRule const& rule : report.fRules) rows += RowWith({Html(rule.fQuestion), Answer(rule)});
  std::size_t const notAsked = RulesNotAsked(report),
                    idle = CountRules(report, [](TStoredRule const&rule) { return rule.fHasNothingToExamine; });
  std::size_t const asked = report.fRules.size() - notAsked - idle;
  std::string const summary = std::to_string(asked) + (asked == 1 ? " rule asked, " : " rules asked, ") + std::to_string(idle) +
                              " had nothing to examine, " + std::to_string(notAsked) + " could not be asked";
  return "<details>" + Element("summary", summary) + Table("Rules", {"Question", "Answer"}, rows) + "</details>\n";
}

std::string Findings(TStoredReport const& report) {
  std::string problems;
  for (TStoredProblem const& problem : report.fProblems) problems += Problem(problem);
  if (!problems.empty()) problems = "<ul class=\"problems\">\n" + problems + "</ul>\n";
  return "<section class=\"card\" id=\"findings\"><h2>Findings</h2>\n" + Verdict(report) + problems + Rules(report) +
         "</section>\n";
}

// ---- Rows and tables ----

std::string RowsAsCard(std::string const& id, std::string const& title, std::vector<TStoredRow> const& rows) {
  std::string html;
  for (TStoredRow const& row : rows)
    html += RowWith({Html(row.fLabel), Cell(row.fAnswer), Element("span", "class=\"soft\"", row.fAnswer.fSource)});
  return Card(id, title, Table(title, {"Name", "Value", "Source"}, html));
}

std::string TextOf(TText const& cell) { return cell.IsKnown() ? *cell.fValue : ""; }

// The keys of a stored report may be any text, and not unique.
std::string IdOfSection(std::size_t at) { return "section-" + std::to_string(at + 1); }

std::string SectionAsCard(std::string const& id, TReportSection const& section) {
  if (section.fRows.empty()) return Card(id, section.fTitle, "<p class=\"none\">none: " + Html(section.fWhyEmpty) + "</p>\n");
  std::vector<std::vector<TText>> rows = section.fRows;
  std::stable_sort(rows.begin(), rows.end(), [](auto const& one, auto const& other) {
    return !one.empty() && ::strverscmp(TextOf(one.front()).c_str(), TextOf(other.front()).c_str()) < 0;
  });
  std::string html;
  for (auto const& row : rows) {
    std::vector<std::string> cells;
    for (TText const& cell : row) cells.push_back(Cell(cell));
    html += RowWith(cells);
  }
  return Card(id, section.fTitle, Table(section.fTitle, section.fColumns, html));
}

std::string PlugIns(TStoredReport const& report) {
  std::string rows;
  for (TStoredProvider const& provider : report.fProviders) {
    char time[32];
    std::snprintf(time, sizeof time, "%.1f ms", provider.fMilliseconds);
    rows += RowWith({Html(provider.fPlugIn), time,
                     provider.fError.empty() ? Html("filled " + provider.fNamespace)
                                             : Element("span", "class=\"error\"", "failed: " + provider.fError)});
  }
  return Card("plug-ins", "Plug-ins", Table("Plug-ins", {"Plug-in", "Time", "Result"}, rows));
}

// ---- Objects ----

// The properties, then the missing ones, which share a line if they share the reason.
std::string Properties(TStoredInstance const& instance) {
  std::string html;
  std::map<std::string, std::string> missing;  // by reason: the names
  for (TStoredProperty const& property : instance.fProperties)
    if (property.IsKnown())
      html += Element("dt", property.fName) + Element("dd", property.fText) + "\n";
    else
      missing[property.fMissing.fReason] += (missing[property.fMissing.fReason].empty() ? "" : ", ") + property.fName;
  for (auto const& [reason, names] : missing)
    html += Element("dt", "class=\"none\"", reason) + Element("dd", "class=\"none\"", names) + "\n";
  return "<dl>" + html + "</dl>";
}

bool IsShown(TStoredInstance const& instance) { return instance.fClass != kMissingValueClass && !instance.IsAssociation(); }

std::string Objects(TStoredReport const& report) {
  std::map<std::string, std::vector<TStoredInstance const*>> classes;
  for (TStoredInstance const& instance : report.fInstances)
    if (IsShown(instance)) classes[instance.fClass].push_back(&instance);
  std::string html = "<p class=\"soft\">Relations between objects are only in the JSON document.</p>\n";
  for (auto const& [name, instances] : classes) {
    html += "<details class=\"class\"><summary>" + Element("span", "class=\"h3\" role=\"heading\" aria-level=\"3\"", name) +
            Element("span", "class=\"count\"", std::to_string(instances.size())) + "</summary>\n";
    for (TStoredInstance const* const instance : instances)
      html += "<div class=\"object\">" + Element("h4", ObjectName(*instance)) + Properties(*instance) + "</div>\n";
    html += "</details>\n";
  }
  return Card("objects", "All objects", html);
}

// ---- The page ----

std::string Header(TStoredReport const& report) {
  std::string const title = report.fHead.empty() ? "" : report.fHead.front();
  std::string html = "<header>\n" + Element("p", "class=\"about\"", "Machine report, " + TimeText(report.fTime)) + "\n" +
                     Element("h1", title) + "\n";
  for (std::size_t at = 1; at < report.fHead.size(); ++at) html += Element("p", "class=\"system\"", report.fHead[at]) + "\n";
  if (!report.fReason.empty()) html += Element("p", "class=\"warning\"", "Not complete: " + report.fReason) + "\n";
  return html + "</header>\n";
}

std::string Link(std::string const& id, std::string const& title, std::size_t count) {
  return "<li><a href=\"#" + Html(id) + "\">" + Html(title) + "</a>" +
         (count == 0 ? "" : Element("span", "class=\"count\"", std::to_string(count))) + "</li>\n";
}

std::string Contents(TStoredReport const& report) {
  std::string links =
      Link("findings", "Findings", report.fProblems.size()) + Link("identity", "Identity", 0) + Link("details", "Details", 0);
  for (std::size_t at = 0; at < report.fSections.size(); ++at)
    links += Link(IdOfSection(at), report.fSections[at].fTitle, report.fSections[at].fRows.size());
  links += Link("plug-ins", "Plug-ins", 0) + Link("objects", "All objects", 0);
  return "<nav aria-label=\"Contents\"><h2>Contents</h2>\n<ul>\n" + links + "</ul></nav>\n";
}

}  // namespace

std::string TimeText(std::string const& time) {
  if (time.size() != sizeof "2026-11-23T04:05:06Z" - 1) return "at an unknown time";
  return time.substr(0, 10) + " " + time.substr(11, 8) + " UTC";
}

std::string ReportAsHtml(TStoredReport const& report) {
  std::string body = "<a class=\"skip\" href=\"#findings\">Skip to the findings</a>\n" + Header(report) +
                     "<div class=\"page\">\n" + Contents(report) + "<main>\n" + Findings(report) +
                     RowsAsCard("identity", "Identity", report.fIdentity) + RowsAsCard("details", "Details", report.fDetails);
  for (std::size_t at = 0; at < report.fSections.size(); ++at) body += SectionAsCard(IdOfSection(at), report.fSections[at]);
  body += PlugIns(report) + Objects(report) + "</main>\n</div>\n<footer>Written by zep " + Html(report.fZep) + "</footer>\n";
  return HtmlPage(report.fHead.empty() ? "Machine report" : report.fHead.front(), body);
}

}  // namespace NQRVZEP20::zep
