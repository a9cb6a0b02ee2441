// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/ReportJson.h"

#include "ICIMInstance.h"
#include "collect/FailureOf.h"
#include "tools/zep/output/FindingsJson.h"
#include "tools/zep/output/PlugInRows.h"
#include "tools/zep/output/ReportPhrases.h"

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

// Adds the instances of every namespace to the document, and the namespaces that failed while they were read.
void AddInstances(TJson& document, std::vector<TPlugIn> const& plugIns) {
  TJson& instances = document["instances"] = TJson::array();
  TJson failures = TJson::array();
  for (TNamespaceView const& view : ViewsOf(plugIns)) {
    TInstanceJson json(view);
    std::string const failure = FailureOf([&] {
      for (auto const& instance : view.AllInstances()) instances.push_back(json.Of(*instance));
    });
    if (!failure.empty()) failures.push_back({{"provider", view.GetProviderName()}, {"error", failure}});
  }
  if (!failures.empty()) document["instanceFailures"] = failures;
}

}  // namespace

TJson ReportAsJson(TReport const& report) {
  EExitStatus const status = ExitStatusOf(report.fCompleteness);
  TJson document = DocumentHead("zep report", status, WhyNotComplete(report), SampleLabelOf(report));
  document["status"] = NameOf(status);
  document["head"] = HeadLines(report);
  document["smbiosTableFile"] = OrNull(report.fTableFile);
  document["findings"] = FindingsAsJson(report.fFindings);
  document["identity"] = RowsAsJson(report.fIdentity);
  document["details"] = RowsAsJson(report.fDetails);
  document["plugInDirectory"] = PlugInDirectory();
  document["plugIns"] = PlugInsAsJson(report.fPlugIns);
  AddInstances(document, report.fPlugIns);
  return document;
}

}  // namespace NQRVZEP20::zep
