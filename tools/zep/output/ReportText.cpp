// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/ReportText.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "MissingValueClass.h"
#include "collect/FailureOf.h"
#include "tools/zep/output/FindingsText.h"
#include "tools/zep/output/InstanceText.h"
#include "tools/zep/output/PlugInRows.h"
#include "tools/zep/output/ReportPhrases.h"
#include "tools/zep/output/SectionText.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <algorithm>

namespace NQRVZEP20::zep {

namespace {

std::string ValueOf(TReportAnswer const& answer) {
  if (answer.IsKnown()) return ValueText(*answer.fValue) + (answer.fNote.empty() ? "" : " (" + answer.fNote + ")");
  return (answer.IsNotApplicable() ? "none: " : "unknown: ") + MessageWithoutSecrets(answer.fMissing.fReason);
}

std::string RowsAsText(std::string const& title, std::vector<TReportRow> const& rows) {
  TTable table({15, 36, 25});
  table.Add({title, "Value", "Source"});
  for (TReportRow const& row : rows) {
    TReportAnswer const& answer = row.fAnswer;
    table.Add({row.fLabel, ValueOf(answer), answer.fSource.empty() ? "none" : answer.fSource});
  }
  return table.GetText();
}

std::string PlugInsAsText(std::string const& title, std::vector<TPlugIn> const& plugIns) {
  TTable table({15, 10, 51});
  table.Add({title, "Time", "Result"});
  for (TPlugIn const& plugIn : plugIns) table.Add({plugIn.fName, TimeTextOf(plugIn), ResultOf(plugIn)});
  if (plugIns.empty()) table.Add({"none", "0.0 ms", "no file lib*.nsp.so in " + PlugInDirectory()});
  return table.GetText();
}

bool IsNamed(TReportParts const& parts, std::string const& name) {
  return std::find(parts.fSections.begin(), parts.fSections.end(), name) != parts.fSections.end();
}

bool IsWanted(TReportParts const& parts, std::string const& name) { return parts.fSections.empty() || IsNamed(parts, name); }

bool HasUnknown(TReportSection const& section) {
  for (auto const& row : section.fRows)
    for (auto const& cell : row)
      if (!cell.IsKnown() && !cell.IsNotApplicable()) return true;
  return false;
}

std::string SectionsAsText(TReport const& report, TReportParts const& parts) {
  constexpr std::size_t rowLimit = 30;
  auto const keys = parts.fSections.empty() ? SectionKeys() : parts.fSections;
  bool hasUnknown = false;
  std::string text;
  for (TReportSection const& section : MakeSections(report.fPlugIns, keys)) {
    text += "\n" + SectionAsText(section, LabelPrefixOf(report), parts.fSections.empty() ? rowLimit : 0);
    hasUnknown = hasUnknown || HasUnknown(section);
  }
  bool const needsHint = hasUnknown && !parts.fAllInstances;
  return needsHint ? text + "\nzep report --full prints why a value is unknown.\n" : text;
}

// Reasons are printed at the values that are missing.
bool IsReason(ICIMInstance const& instance) {
  return instance.GetClass(TCIMContext())->GetName(TCIMContext()) == kMissingValueClass;
}

// A provider may fail while it is read; then its other instances are missing, which its row among the plug-ins cannot say.
std::string InstancesAsText(TReport const& report) {
  std::string text;
  for (TNamespaceView const& view : ViewsOf(report.fPlugIns)) {
    std::string const failure = FailureOf([&] {
      for (auto const& instance : view.AllInstances())
        if (!IsReason(*instance) && view.IsOfReport(*instance)) text += "\n" + InstanceAsText(view, *instance);
    });
    if (!failure.empty()) text += "\n" + Printable("provider " + view.GetProviderName() + " failed: " + failure) + "\n";
  }
  return text;
}

}  // namespace

std::vector<std::string> SectionNames() {
  std::vector<std::string> names = SectionKeys();
  names.insert(names.begin(), {kFindingsPart, kIdentityPart, kDetailsPart});
  names.emplace_back(kPlugInsPart);
  return names;
}

std::string ReportAsText(TReport const& report, TReportParts const& parts) {
  std::string const label = LabelPrefixOf(report);
  std::string text;
  for (std::string const& line : HeadLines(report)) text += Printable(line) + "\n";
  if (!report.fTableFile.empty())
    text += Printable("SMBIOS tables read from the file " + report.fTableFile + " (ZEP_SMBIOS_TABLE)") + "\n";
  if (IsWanted(parts, kFindingsPart)) text += "\n" + FindingsAsText(report.fFindings, label);
  if (IsNamed(parts, kFindingsPart)) text += "\n" + RulesAsText(report.fFindings, label);
  if (IsWanted(parts, kIdentityPart)) text += "\n" + RowsAsText(label + "Identity", report.fIdentity);
  if (IsWanted(parts, kDetailsPart)) text += "\n" + RowsAsText(label + "Details", report.fDetails);
  text += SectionsAsText(report, parts);
  if (IsWanted(parts, kPlugInsPart)) text += "\n" + PlugInsAsText(label + "Plug-in", report.fPlugIns);
  return parts.fAllInstances ? text + InstancesAsText(report) : text;
}

}  // namespace NQRVZEP20::zep
