// SPDX-License-Identifier: Apache-2.0
#include "collect/Report.h"

#include "ICIMInstance.h"
#include "collect/Sample.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"

namespace NQRVZEP20::zep {

namespace {

TJson RowsAsJson(std::vector<TReportRow> const& rows) {
  TJson json = TJson::object();
  for (TReportRow const& row : rows) {
    TAnswer const& answer = row.fAnswer;
    TJson& entry = json[row.fKey] = {{"label", row.fLabel}, {"value", nullptr}, {"source", nullptr}};
    if (answer.fIsKnown) entry["value"] = answer.fValue;
    if (!answer.fSource.empty()) entry["source"] = answer.fSource;
    if (!answer.fNote.empty()) entry["note"] = answer.fNote;
    if (!answer.fIsKnown) entry["code"] = answer.fMissing.fCode, entry["reason"] = answer.fMissing.fReason;
  }
  return json;
}

TJson PlugInsAsJson(std::vector<TPlugIn> const& plugIns) {
  TJson json = TJson::array();
  for (TPlugIn const& plugIn : plugIns) {
    TJson providers = TJson::array();
    for (TProviderRun const& provider : plugIn.fProviders)
      providers.push_back({{"name", provider.fName},
                           {"namespace", provider.fView ? TJson(provider.fView->GetName()) : TJson(nullptr)},
                           {"milliseconds", provider.fMilliseconds},
                           {"error", OrNull(provider.fError)}});
    json.push_back({{"name", plugIn.fName},
                    {"file", plugIn.fFile},
                    {"milliseconds", plugIn.fMilliseconds},
                    {"error", OrNull(plugIn.fError)},
                    {"providers", providers}});
  }
  return json;
}

// Adds the instances of every namespace to the document, and the namespaces that failed while they were read.
void AddInstances(TJson& document, std::vector<TPlugIn> const& plugIns) {
  TJson& instances = document["instances"] = TJson::array();
  TJson failures = TJson::array();
  for (TNamespaceView const& view : ViewsOf(plugIns)) {
    std::string const failure = FailureOf([&] {
      for (auto const& instance : view.AllInstances()) instances.push_back(InstanceAsJson(view, *instance));
    });
    if (!failure.empty()) failures.push_back({{"provider", view.GetProviderName()}, {"error", failure}});
  }
  if (!failures.empty()) document["instanceFailures"] = failures;
}

}  // namespace

TJson ReportAsJson(TReport const& report) {
  TJson document = DocumentHead("zep report", report.fStatus, WhyNotComplete(report));
  document["status"] = NameOf(report.fStatus);
  document["head"] = report.fHead;
  document["smbiosTableFile"] = OrNull(TableFile());
  document["identity"] = RowsAsJson(report.fIdentity);
  document["details"] = RowsAsJson(report.fDetails);
  document["plugInDirectory"] = PlugInDirectory();
  document["plugIns"] = PlugInsAsJson(report.fPlugIns);
  AddInstances(document, report.fPlugIns);
  return document;
}

}  // namespace NQRVZEP20::zep
