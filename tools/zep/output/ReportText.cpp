// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/ReportText.h"

#include "tools/zep/output/PlugInRows.h"
#include "tools/zep/output/ReportPhrases.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

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

}  // namespace

std::string ReportAsText(TReport const& report) {
  std::string const label = LabelPrefixOf(report);
  std::string text;
  for (std::string const& line : HeadLines(report)) text += Printable(line) + "\n";
  if (!report.fTableFile.empty())
    text += Printable("SMBIOS tables read from the file " + report.fTableFile + " (ZEP_SMBIOS_TABLE)") + "\n";
  return text + "\n" + RowsAsText(label + "Identity", report.fIdentity) + "\n" + RowsAsText(label + "Details", report.fDetails) +
         "\n" + PlugInsAsText(label + "Plug-in", report.fPlugIns);
}

}  // namespace NQRVZEP20::zep
