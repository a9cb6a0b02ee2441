// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/ReportJson.h"

#include "ICIMInstance.h"
#include "collect/FailureOf.h"
#include "tools/zep/output/FindingsJson.h"
#include "tools/zep/output/PlugInRows.h"
#include "tools/zep/output/ReportPhrases.h"

#include <cstring>
#include <string_view>

namespace NQRVZEP20::zep {

namespace {

TJson RowsAsJson(std::vector<TReportRow> const& rows) {
  TJson json = TJson::object();
  for (TReportRow const& row : rows) {
    TReportAnswer const& answer = row.fAnswer;
    TJson& entry = json[row.fKey] = {{"label", row.fLabel}, {"value", nullptr}, {"source", nullptr}};
    if (answer.IsKnown()) entry["value"] = ValueText(*answer.fValue);
    if (!answer.fSource.empty()) entry["source"] = answer.fSource;
    if (!answer.fNote.empty()) entry["note"] = answer.fNote;
    if (!answer.IsKnown()) entry["code"] = answer.fMissing.fCode, entry["reason"] = answer.fMissing.fReason;
  }
  return json;
}

TJson PlugInsAsJson(std::vector<TPlugIn> const& plugIns) {
  TJson json = TJson::array();
  for (TPlugIn const& plugIn : plugIns) json.push_back(PlugInAsJson(plugIn));
  return json;
}

constexpr char const* kLineOfInstances = "\n  \"instances\": ";  // in no text of the document, which has no line ends

// The lines of the document, indented as an element of an array in a member of the outermost object.
void AppendElement(std::string& array, std::string_view lines) {
  constexpr char const* indentation = "\n    ";
  if (!array.empty()) array += ',';
  array += indentation;
  lines.remove_suffix(1);  // the last line end
  for (std::size_t end; (end = lines.find('\n')) != lines.npos; lines.remove_prefix(end + 1))
    array.append(lines.substr(0, end)).append(indentation);
  array += lines;
}

}  // namespace

TReportDocument::TReportDocument(TReport const& report, EMessages messages) : fMessages(messages) {
  EExitStatus const status = ExitStatusOf(report.fCompleteness);
  fMembers = DocumentHead("zep report", status, WhyNotComplete(report), SampleLabelOf(report));
  fMembers["status"] = NameOf(status);
  fMembers["head"] = HeadLines(report);
  fMembers["smbiosTableFile"] = OrNull(report.fTableFile);
  fMembers["findings"] = FindingsAsJson(report.fFindings);
  fMembers["identity"] = RowsAsJson(report.fIdentity);
  fMembers["details"] = RowsAsJson(report.fDetails);
  fMembers["plugInDirectory"] = PlugInDirectory();
  fMembers["plugIns"] = PlugInsAsJson(report.fPlugIns);
  AddInstances(report.fPlugIns);
}

// Also adds the namespaces that failed while they were read.
void TReportDocument::AddInstances(std::vector<TPlugIn> const& plugIns) {
  constexpr std::size_t usualSize = std::size_t(1) << 20;
  fMembers["instances"] = nullptr;
  fInstances.reserve(usualSize);  // growing, it would copy itself into new pages many times
  TJson failures = TJson::array();
  for (TNamespaceView const& view : ViewsOf(plugIns)) {
    TInstanceJson json(view);
    std::string const failure = FailureOf([&] {
      for (auto const& instance : view.AllInstances()) {
        TJson element = json.Of(*instance);
        AppendElement(fInstances, fMessages == EMessages::kVerbatim ? AsVerbatimText(element) : AsText(std::move(element)));
      }
    });
    if (!failure.empty()) failures.push_back({{"provider", view.GetProviderName()}, {"error", failure}});
  }
  if (!failures.empty()) fMembers["instanceFailures"] = failures;
}

std::string TReportDocument::Text() const {
  std::string text = fMessages == EMessages::kVerbatim ? AsVerbatimText(fMembers) : AsText(fMembers);
  std::size_t const line = text.find(kLineOfInstances);
  if (line == text.npos) return text;
  std::size_t const begin = line + std::strlen(kLineOfInstances);
  std::string const rest = text.substr(begin + std::strlen("null"));
  text.resize(begin);
  text.reserve(begin + fInstances.size() + rest.size() + 8);
  return text.append("[").append(fInstances).append(fInstances.empty() ? "]" : "\n  ]").append(rest);
}

}  // namespace NQRVZEP20::zep
