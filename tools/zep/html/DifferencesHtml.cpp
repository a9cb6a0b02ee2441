// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/html/DifferencesHtml.h"

#include "tools/zep/html/Html.h"
#include "tools/zep/html/ReportHtml.h"
#include "tools/zep/output/DifferencesText.h"

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kArrow = " \xe2\x86\x92 ";

std::string Item(std::string const& severity, std::string const& kind, std::string const& what, std::string const& more) {
  return "<li class=\"" + Html(severity) + "\">" + Element("span", "class=\"severity\"", kind) +
         Element("p", "class=\"what\"", what) + more + "</li>\n";
}

std::string Changes(std::vector<TChange> const& changes) {
  std::string html;
  for (TChange const& change : changes)
    html += Element("dt", change.fName) + "<dd>" + Element("del", change.fBefore) + kArrow + Element("ins", change.fAfter) +
            "</dd>\n";
  return html.empty() ? "" : "<dl>" + html + "</dl>";
}

// Of a problem that the later report has.
std::string Problem(std::string const& kind, TStoredProblem const& problem) {
  return Item(problem.fSeverity, kind, problem.fReason, problem.fRemedy.empty() ? "" : Element("p", problem.fRemedy));
}

std::string Object(TObjectDifference const& object) {
  bool const isGone = object.fKind == TObjectDifference::EKind::kGone;
  return Item(isGone ? "error" : "information", NameOf(object.fKind), object.fName,
              Element("span", "class=\"soft\"", object.fClass) + Changes(object.fChanges));
}

std::string List(std::string const& title, std::string const& items) {
  if (items.empty()) return "";
  return "<section class=\"card\">" + Element("h2", title) + "<ul class=\"problems\">\n" + items + "</ul></section>\n";
}

}  // namespace

std::string DifferencesAsHtml(TDifferences const& differences, TStoredReport const& before, TStoredReport const& after) {
  std::string problems, objects, notCompared;
  for (TStoredProblem const& problem : differences.fNewProblems) problems += Problem("new " + problem.fSeverity, problem);
  for (auto const& [severityBefore, problem] : differences.fChangedProblems)
    problems += Problem(severityBefore + kArrow + problem.fSeverity, problem);
  for (TStoredProblem const& problem : differences.fSolvedProblems) problems += Item("fine", "solved", problem.fReason, "");
  for (TObjectDifference const& object : differences.fObjects) objects += Object(object);
  for (std::string const& reason : differences.fNotCompared) notCompared += Item("warning", "not compared", reason, "");
  std::string const rows = differences.fRows.empty() ? "" : "<li class=\"information\">" + Changes(differences.fRows) + "</li>\n";
  std::string const counts = CountsOf(differences), title = after.fHead.empty() ? "" : after.fHead.front();
  return HtmlPage("Differences: " + title,
                  "<header>\n" +
                      Element("p", "class=\"about\"", "Changes from " + TimeText(before.fTime) + " to " + TimeText(after.fTime)) +
                      Element("h1", title) + Element("p", "class=\"verdict\"", counts.empty() ? "No differences" : counts) +
                      "</header>\n<div class=\"page one\">\n<main>\n" + List("Problems", problems) + List("Machine", rows) +
                      List("Objects", objects) + List("Not compared", notCompared) + "</main>\n</div>\n");
}

}  // namespace NQRVZEP20::zep
