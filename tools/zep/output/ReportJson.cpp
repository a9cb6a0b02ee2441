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

// Appends the lines of a document, indented as an element of an array in a member of the outermost object.
void AppendElement(std::string& array, std::string_view lines) {
  constexpr char const* indentation = "\n    ";
  array += indentation;
  lines.remove_suffix(1);  // the last line end
  for (std::size_t end; (end = lines.find('\n')) != lines.npos; lines.remove_prefix(end + 1))
    array.append(lines.substr(0, end)).append(indentation);
  array += lines;
}

}  // namespace

TReportDocument::TReportDocument(TReport const& report, EMessages messages) : fMessages(messages), fPlugIns(&report.fPlugIns) {
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
  fMembers["instances"] = nullptr;
}

void TReportDocument::Write(TWriter const& write) const {
  std::string const text = TextOf(fMembers);
  std::size_t const line = text.find(kLineOfInstances);
  if (line == text.npos) return write(text);
  std::size_t const begin = line + std::strlen(kLineOfInstances);
  write(text.substr(0, begin) + "[");
  TJson members = fMembers;
  TJson const failures = WriteInstances(write);
  if (!failures.empty()) members["instanceFailures"] = failures;
  write("]" + TextOf(members).substr(begin + std::strlen("null")));
}

std::string TReportDocument::Text() const {
  std::string text;
  Write([&text](std::string const& piece) { text += piece; });
  return text;
}

std::string TReportDocument::TextOf(TJson json) const {
  return fMessages == EMessages::kVerbatim ? AsVerbatimText(json) : AsText(std::move(json));
}

// Writes the elements of the array, and returns the namespaces that failed while they were read.
TJson TReportDocument::WriteInstances(TWriter const& write) const {
  constexpr std::size_t pieceSize = 65536;
  TJson failures = TJson::array();
  std::string piece;
  bool isFirst = true;
  for (TNamespaceView const& view : ViewsOf(*fPlugIns)) {
    TInstanceJson json(view);
    std::vector<boost::shared_ptr<ICIMInstance>> instances;
    std::string failure = FailureOf([&] { instances = view.AllInstances(); });
    for (auto instance = instances.begin(); instance != instances.end() && failure.empty(); ++instance) {
      std::string element;
      failure = FailureOf([&] { element = TextOf(json.Of(**instance)); });
      if (!failure.empty()) break;
      if (!std::exchange(isFirst, false)) piece += ',';
      AppendElement(piece, element);
      if (piece.size() >= pieceSize) write(std::exchange(piece, std::string()));
    }
    if (!failure.empty()) failures.push_back({{"provider", view.GetProviderName()}, {"error", failure}});
  }
  write(isFirst ? piece : piece + "\n  ");
  return failures;
}

}  // namespace NQRVZEP20::zep
