// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/StoredReports.h"

#include "collect/redaction/Redaction.h"
#include "collect/stored/StoredDocument.h"
#include "tools/zep/html/DifferencesHtml.h"
#include "tools/zep/html/ReportHtml.h"
#include "tools/zep/output/DifferencesText.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/OutputFile.h"
#include "tools/zep/output/StoredReportText.h"

namespace NQRVZEP20::zep {

TStoredReport ReadReport(std::string const& file) {
  try {
    return ReadStoredReport(file);
  } catch (TStoredReportError const& failure) {
    throw TFailure(kExitNoInput, failure.what());
  }
}

namespace {

// The document of a redacted report names the kinds of secrets and the map.
void CheckRedaction(TJson const& document, std::string const& file) {
  try {
    if (IsRedacted(document)) RedactedWith(document);
  } catch (TRedactionError const& failure) {
    throw TFailure(kExitNoInput, file + ": " + failure.what());
  }
}

}  // namespace

TJson ReadDocument(std::string const& file, TRedactionArguments const& redaction) {
  try {
    TJson document = ReadStoredDocument(file);
    CheckRedaction(document, file);
    if (redaction.IsWanted()) RedactDocument(document, redaction);
    return document;
  } catch (TStoredReportError const& failure) {
    throw TFailure(kExitNoInput, failure.what());
  }
}

TStoredReport ReadReport(std::string const& file, TRedactionArguments const& redaction) {
  return redaction.IsWanted() ? StoredReportOf(ReadDocument(file, redaction), file) : ReadReport(file);
}

EExitStatus StatusOf(TStoredReport const& report) {
  return report.fStatus == "complete" ? kExitComplete : report.fStatus == "partial" ? kExitPartial : kExitNothing;
}

void PrintOrWritePage(TStoredReport const& report, std::string const& file) {
  if (file.empty())
    WriteOutput(StoredReportAsText(report));
  else
    WriteOutputFile(file, ReportAsHtml(report));
}

namespace {

// Equal pseudonyms would stand for different secrets, and different ones for the same.
void CheckPseudonyms(TStoredReport const& before, TStoredReport const& after) {
  if (before.fRedaction == after.fRedaction) return;
  bool const areBoth = !before.fRedaction.empty() && !after.fRedaction.empty();
  std::string const& redacted = before.fRedaction.empty() ? after.fFile : before.fFile;
  throw TFailure(kExitNoInput,
                 before.fFile + " and " + after.fFile + " cannot be compared: " +
                     (areBoth ? "they were redacted with different maps or kinds, so that their pseudonyms do not agree"
                              : "only " + redacted + " is redacted") +
                     "; redact both alike, or give the originals back with zep unredact");
}

// The names of files may contain what is redacted in them, such as the names of the host and the user.
void HideFiles(TStoredReport& before, TStoredReport& after) {
  if (before.fRedaction.empty()) return;
  before.fFile = "the earlier report";
  after.fFile = "the later report";
}

}  // namespace

EExitStatus PrintDifferences(std::string const& document, TStoredReport before, TStoredReport after,
                             TDifferenceOutput const& output) {
  CheckPseudonyms(before, after);
  HideFiles(before, after);
  TDifferences const differences = DifferencesOf(before, after);
  EExitStatus const status = !differences.IsSame()              ? kExitNothing
                             : differences.fNotCompared.empty() ? kExitComplete
                                                                : kExitPartial;
  if (!output.fHtmlFile.empty()) WriteOutputFile(output.fHtmlFile, DifferencesAsHtml(differences, before, after));
  if (output.fAsJson)
    WriteOutput(AsText(DifferencesAsJson(document, status, differences, before, after)));
  else if (output.fHtmlFile.empty())
    WriteOutput(DifferencesAsText(differences));
  return status;
}

}  // namespace NQRVZEP20::zep
