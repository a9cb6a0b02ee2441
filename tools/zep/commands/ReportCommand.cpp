// SPDX-License-Identifier: Apache-2.0

// zep report: which machine this is.

#include "collect/Report.h"
#include "collect/stored/StoredDocument.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/commands/ReportArguments.h"
#include "tools/zep/commands/ReportDelivery.h"
#include "tools/zep/commands/StoredReports.h"
#include "tools/zep/commands/TMadeReport.h"
#include "tools/zep/commands/Thresholds.h"
#include "tools/zep/media/Media.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/recording/TReplay.h"

#include <CLI/CLI.hpp>

#include <filesystem>
#include <iostream>
#include <memory>
#include <optional>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

// Writes the bundle of a stored report, and prints what it has unless the document is printed.
void BundleFrom(TJson const& document, TReportArguments const& arguments) {
  TBundleManifest const manifest =
      WriteBundle(arguments.fBundle, AsVerbatimText(document), RedactedKinds(document), EvidenceOfStored());
  if (!arguments.fAsJson) WriteMessage(TextAbout(manifest, arguments.fBundle));
}

int ReportFrom(TReportArguments const& arguments) {
  if (!arguments.fAsJson && !arguments.fBundle.IsWanted()) {
    TStoredReport const report = ReadReport(arguments.fFrom, arguments.fRedaction);
    PrintOrWritePage(report, arguments.fHtmlFile);
    return zep::StatusOf(report);
  }
  if (arguments.fAsJson && !arguments.fRedaction.IsWanted())
    throw TWrongUsage("--from and --json exclude each other without --redact");
  CheckSigning(arguments.fBundle);
  TJson const document = ReadDocument(arguments.fFrom, arguments.fRedaction);
  TStoredReport const report = StoredReportOf(document, arguments.fFrom);
  if (!arguments.fHtmlFile.empty()) PrintOrWritePage(report, arguments.fHtmlFile);
  if (arguments.fBundle.IsWanted()) BundleFrom(document, arguments);
  if (arguments.fAsJson) WriteOutput(AsVerbatimText(document));
  return zep::StatusOf(report);
}

TReport ReportHere(std::optional<TSample> const& sample, TReportArguments const& arguments) {
  return MakeReport(LoadPlugInsFor(arguments.fPlugIns, sample), sample, {ThresholdSettings()});
}

// Both reports are redacted with the same map, so that they differ only where their originals do.
int ReportSince(TReportArguments const& arguments) {
  TStoredReport before = ReadReport(arguments.fSince, arguments.fRedaction);
  auto const sample = SampleIf(arguments.fSample);
  TStoredReport now = TMadeReport(ReportHere(sample, arguments), arguments.fRedaction).Stored();
  return PrintDifferences("zep report --since", std::move(before), std::move(now), {arguments.fAsJson, arguments.fHtmlFile});
}

// The report on the machine that `replay` makes the plug-ins read.
TReport ReportOn(TReplay const& replay, TReportArguments const& arguments) {
  auto const files = replay.Choose(FindPlugInsFor(arguments.fPlugIns));
  TRecordingIndex const& index = replay.Index();
  TReport report = MakeReport(LoadPlugInsFor(arguments.fPlugIns, std::nullopt, files), std::nullopt, {index.fThresholds});
  report.fRecorded = index.fTime;
  if (!index.fPlugInDirectory.empty())
    for (TPlugIn& plugIn : report.fPlugIns)
      plugIn.fFile = index.fPlugInDirectory + "/" + std::filesystem::path(plugIn.fFile).filename().string();
  return report;
}

// Why the bundle of the report shall have no recording; empty if it shall have one.
std::string WhyNoRecording(TReportArguments const& arguments) {
  if (arguments.fSample) return "the report is on the sample, which is not a machine";
  return arguments.fRedaction.IsWanted() ? "it has the secrets that the other pieces have pseudonyms for" : "";
}

// Prints the message of an interrupted run itself: the signal ends zep when `guard` ends.
int Report(TReportArguments const& arguments) {
  std::optional<TSample> sample;
  std::optional<TInterruptGuard> guard;
  std::optional<TReplay> replay;  // both end before the guard, because the signal then ends zep
  std::optional<TEvidenceReading> reading;
  try {
    if (arguments.fFormat == kJsonLines && !arguments.fMedium.empty())
      throw TWrongUsage("--format jsonl and --to-media exclude each other");
    TTarget const target = arguments.fTarget.empty() ? TTarget{} : TargetOf(arguments.fTarget, arguments.fBySftp);
    if (!arguments.fMedium.empty()) CheckDevice(arguments.fMedium);
    CheckSigning(arguments.fBundle);
    if (!arguments.fReplay.empty() || arguments.fBundle.IsWanted()) guard.emplace();
    if (!arguments.fReplay.empty()) replay.emplace(arguments.fReplay);
    if (arguments.fBundle.IsWanted()) reading.emplace(arguments.fReplay, WhyNoRecording(arguments));
    sample = SampleIf(arguments.fSample);
    TReport report = replay ? ReportOn(*replay, arguments) : ReportHere(sample, arguments);
    TEvidence evidence = reading ? reading->Finish(report.fPlugIns) : TEvidence();
    TMadeReport const made(std::move(report), arguments.fRedaction, evidence.fLog.value_or(""));
    if (evidence.fLog) evidence.fLog = made.Log();
    return Deliver(made, evidence, target, arguments, guard);
  } catch (std::exception const& failure) {
    bool const isOfMedium = !arguments.fMedium.empty() && arguments.fAsJson && !HasWrittenOutput();
    if (isOfMedium) WriteOutput(FailureAsJson(kToMedia, zep::StatusOf(failure), failure.what(), sample ? sample->fLabel : ""));
    if (PendingInterrupt() == 0) throw;
    std::cerr << "zep: " << Printable(failure.what()) << "\n";
    return zep::StatusOf(failure);
  }
}

}  // namespace

TRun AddReportArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TReportArguments>();
  AddReportOptions(command, *arguments);
  command.footer(
      "Exit status: 0 when the identity is complete, even if details are missing, 2 when part of the identity is missing or\n"
      "a plug-in failed, 3 when a finding is as severe as --fail-on says or worse, 1 when none of it is known or the medium\n"
      "could not be mounted, written or unmounted, 64 for wrong usage; when the report could not be sent, the exit status\n"
      "of zep send; 2 when a bundle lacks a recording that could not be made. With --from it is that of the stored report,\n"
      "with --since that of zep diff; 66 when the stored report, the recording, or the key of --sign is refused, 73 when the\n"
      "page or the bundle cannot be written, or the temporary directory is full.");
  return [arguments] {
    if (!arguments->fFrom.empty()) return ReportFrom(*arguments);
    return arguments->fSince.empty() ? Report(*arguments) : ReportSince(*arguments);
  };
}

}  // namespace NQRVZEP20::zep
