// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/ReportJson.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "TAddToVectorCallback.h"
#include "collect/FailureOf.h"
#include "collect/Sections.h"
#include "collect/stored/StoredReport.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/FindingsJson.h"
#include "tools/zep/output/InstanceJson.h"
#include "tools/zep/output/PlugInRows.h"
#include "tools/zep/output/ReportPhrases.h"
#include "tools/zep/output/TClassRows.h"

#include <cstring>
#include <ctime>
#include <filesystem>
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

TJson CellAsJson(TReportSection::TCell const& cell) {
  if (cell.IsKnown()) return *cell.fValue;
  return {{"code", cell.fMissing.fCode}, {"reason", cell.fMissing.fReason}};
}

TJson SectionsAsJson(std::vector<TReportSection> const& sections) {
  TJson json = TJson::array();
  for (TReportSection const& section : sections) {
    TJson rows = TJson::array();
    for (auto const& row : section.fRows) {
      rows.push_back(TJson::array());
      for (auto const& cell : row) rows.back().push_back(CellAsJson(cell));
    }
    json.push_back({{"key", section.fKey},
                    {"title", section.fTitle},
                    {"columns", section.fColumns},
                    {"rows", rows},
                    {"whyEmpty", OrNull(section.fWhyEmpty)}});
  }
  return json;
}

// "2026-11-23T04:05:06Z"
std::string Now() {
  std::time_t const now = std::time(nullptr);
  std::tm utc{};
  ::gmtime_r(&now, &utc);
  char text[sizeof "2026-11-23T04:05:06Z"];
  std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%SZ", &utc);
  return text;
}

constexpr char const* kLineOfInstances = "\n  \"instances\": ";  // in no text of the document, which has no line ends

// The instances, without those that follow a failure in their tree of classes. `failure`: the first one.
std::vector<boost::shared_ptr<ICIMInstance>> ReadableInstances(TNamespaceView const& view, std::string& failure) {
  std::vector<boost::shared_ptr<ICIMInstance>> instances;
  auto const addOf = [&](boost::shared_ptr<ICIMClass> const& rootClass) {
    std::string const why =
        FailureOf([&] { rootClass->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), TCIMContext()); });
    if (failure.empty()) failure = why;
    return true;
  };
  std::string const why = FailureOf([&] { view.Get()->EnumerateClasses(addOf, TCIMContext()); });
  if (failure.empty()) failure = why;
  return instances;
}

// The classes of all instances, each once. A class that fails while it is read is left out, like its instances.
TJson ClassesAsJson(std::vector<TPlugIn> const& plugIns) {
  TClassRows rows;
  for (TNamespaceView const& view : ViewsOf(plugIns)) {
    std::string ignored;
    for (auto const& instance : ReadableInstances(view, ignored)) FailureOf([&] { rows.AddClassOf(*instance); });
  }
  return rows.AsJson();
}

// That of a recorded machine is where its plug-ins were.
std::string DirectoryOfPlugIns(TReport const& report) {
  if (report.fRecorded.empty() || report.fPlugIns.empty()) return PlugInDirectory();
  return std::filesystem::path(report.fPlugIns.front().fFile).parent_path().string();
}

// Refuses a report that has become too long to be held in memory.
void CheckLength(std::size_t bytes, std::size_t most) {
  if (bytes > most)
    throw TFailure(kExitNothing, "the report is longer than " + std::to_string(most >> 20) +
                                     " MiB, the limit for a page, a comparison and a redacted report; print it with --json or "
                                     "--format jsonl");
}

}  // namespace

TReportDocument::TReportDocument(TReport const& report, EMessages messages) : fMessages(messages), fPlugIns(&report.fPlugIns) {
  EExitStatus const status = ExitStatusOf(report.fCompleteness);
  fMembers = DocumentHead("zep report", status, WhyNotComplete(report), SampleLabelOf(report));
  fMembers["status"] = NameOf(status);
  fMembers["time"] = report.fRecorded.empty() ? Now() : report.fRecorded;
  fMembers["head"] = HeadLines(report);
  fMembers["smbiosTableFile"] = OrNull(report.fTableFile);
  fMembers["findings"] = FindingsAsJson(report.fFindings);
  fMembers["identity"] = RowsAsJson(report.fIdentity);
  fMembers["details"] = RowsAsJson(report.fDetails);
  fMembers["sections"] = SectionsAsJson(MakeSections(report.fPlugIns, SectionKeys()));
  fMembers["plugInDirectory"] = DirectoryOfPlugIns(report);
  fMembers["plugIns"] = PlugInsAsJson(report.fPlugIns);
  fMembers["classes"] = ClassesAsJson(report.fPlugIns);
  fMembers["instances"] = nullptr;
}

void TReportDocument::ReadInstances() {
  TJson instances = TJson::array();
  std::size_t bytes = 0;
  TJson failures = ForEachInstance(TJsonText::kOnOneLine, [&](std::string const& text) {
    CheckLength(bytes += text.size(), kStoredReportLimit);
    instances.push_back(TJson::parse(text));
  });
  fMembers["instances"] = std::move(instances);
  if (!failures.empty()) fMembers["instanceFailures"] = std::move(failures);
  fPlugIns = nullptr;
}

void TReportDocument::Write(TWriter const& write) const {
  std::string const text = TextOf(fMembers);
  std::size_t const line = text.find(kLineOfInstances);
  if (line == text.npos || fPlugIns == nullptr) return write(text);
  std::size_t const begin = line + std::strlen(kLineOfInstances);
  write(text.substr(0, begin) + "[");
  TJson members = fMembers;
  TJson const failures = WriteInstances(write);
  if (!failures.empty()) members["instanceFailures"] = failures;
  write("]" + TextOf(members).substr(begin + std::strlen("null")));
}

std::string TReportDocument::Text(std::size_t most) const {
  std::string text;
  Write([&text, most](std::string const& piece) {
    CheckLength(text.size() + piece.size(), most);
    text += piece;
  });
  return text;
}

std::string TReportDocument::TextOf(TJson json) const {
  return fMessages == EMessages::kVerbatim ? AsVerbatimText(json) : AsText(std::move(json));
}

std::string TReportDocument::LineOf(TJson json) const {
  return fMessages == EMessages::kVerbatim ? AsVerbatimLine(json) : AsLine(std::move(json));
}

void TReportDocument::WriteLines(TWriter const& write) const {
  TJson members = fMembers;
  members.erase("instances");
  members.erase("instanceFailures");
  write(LineOf(std::move(members)));
  std::size_t count = 0;
  auto const writeLine = [&](std::string const& line) {
    write(line);
    ++count;
  };
  TJson failures = fMembers.value("instanceFailures", TJson::array());
  if (fPlugIns != nullptr)
    failures = ForEachInstance(TJsonText::kOnOneLine, [&](std::string const& text) { writeLine(text + "\n"); });
  else
    for (TJson const& instance : fMembers.value("instances", TJson::array())) writeLine(LineOf(instance));
  write(LineOf({{"instances", count}, {"instanceFailures", failures}}));
}

// Writes the elements of the array, and returns the namespaces that failed while they were read.
TJson TReportDocument::WriteInstances(TWriter const& write) const {
  constexpr std::size_t pieceSize = 65536;
  constexpr int depth = 2;
  std::string piece;
  bool isFirst = true;
  TJson failures = ForEachInstance(depth, [&](std::string const& instance) {
    piece.append(std::exchange(isFirst, false) ? "\n    " : ",\n    ").append(instance);
    if (piece.size() < pieceSize) return;
    write(piece);
    piece.clear();
  });
  write(isFirst ? piece : piece + "\n  ");
  return failures;
}

// Makes the text of one instance after the other. An instance that cannot be read is left out, and the first of a namespace is
// part of the result; what `use` throws is passed on.
TJson TReportDocument::ForEachInstance(int depth, TWriter const& use) const {
  TJson failures = TJson::array();
  std::string text;
  for (TNamespaceView const& view : ViewsOf(*fPlugIns)) {
    TInstanceJson json(view, fMessages);
    std::string failure;
    for (auto const& instance : ReadableInstances(view, failure)) {
      text.clear();
      std::string const why = FailureOf([&] { json.Append(*instance, text, depth); });
      if (why.empty()) use(text);
      if (failure.empty()) failure = why;
    }
    if (!failure.empty()) failures.push_back({{"provider", view.GetProviderName()}, {"error", failure}});
  }
  return failures;
}

}  // namespace NQRVZEP20::zep
