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

#include <iostream>
#include <memory>
#include <optional>

namespace NQRVZEP20::zep {

namespace {

int ReportFrom(TReportArguments const& arguments) {
  if (!arguments.fAsJson) {
    TStoredReport const report = ReadReport(arguments.fFrom, arguments.fRedaction);
    PrintOrWritePage(report, arguments.fHtmlFile);
    return StatusOf(report);
  }
  if (!arguments.fRedaction.IsWanted()) throw TWrongUsage("--from and --json exclude each other without --redact");
  TJson const document = ReadDocument(arguments.fFrom, arguments.fRedaction);
  TStoredReport const report = StoredReportOf(document, arguments.fFrom);
  if (!arguments.fHtmlFile.empty()) PrintOrWritePage(report, arguments.fHtmlFile);
  WriteOutput(AsVerbatimText(document));
  return StatusOf(report);
}

TReport ReportHere(std::optional<TSample> const& sample, TReportArguments const& arguments) {
  return MakeReport(LoadPlugInsFor(arguments.fPlugIns, sample), sample, {ThresholdSettings()});
}

// Both reports are redacted with the same map, so that they differ only where their originals do.
int ReportSince(TReportArguments const& arguments) {
  TStoredReport const before = ReadReport(arguments.fSince, arguments.fRedaction);
  auto const sample = SampleIf(arguments.fSample);
  TStoredReport const now = TMadeReport(ReportHere(sample, arguments), arguments.fRedaction).Stored();
  return PrintDifferences("zep report --since", before, now, {arguments.fAsJson, arguments.fHtmlFile});
}

// The report on the machine that `replay` makes the plug-ins read.
TReport ReportOn(TReplay const& replay, TReportArguments const& arguments) {
  auto const files = replay.Choose(FindPlugInsFor(arguments.fPlugIns));
  TReport report = MakeReport(LoadPlugInsFor(arguments.fPlugIns, std::nullopt, files), std::nullopt, {ThresholdSettings()});
  report.fRecorded = replay.Index().fTime;
  return report;
}

// Prints the message of an interrupted run itself: the signal ends zep when `guard` ends.
int Report(TReportArguments const& arguments) {
  std::optional<TSample> sample;
  std::optional<TInterruptGuard> guard;
  std::optional<TReplay> replay;  // ends before the guard, because the signal then ends zep
  try {
    if (arguments.fFormat == kJsonLines && !arguments.fMedium.empty())
      throw TWrongUsage("--format jsonl and --to-media exclude each other");
    TTarget const target = arguments.fTarget.empty() ? TTarget{} : TargetOf(arguments.fTarget, arguments.fBySftp);
    if (!arguments.fMedium.empty()) CheckDevice(arguments.fMedium);
    if (!arguments.fReplay.empty()) {
      guard.emplace();
      replay.emplace(arguments.fReplay);
    }
    sample = SampleIf(arguments.fSample);
    TReport report = replay ? ReportOn(*replay, arguments) : ReportHere(sample, arguments);
    return Deliver(TMadeReport(std::move(report), arguments.fRedaction), target, arguments, guard);
  } catch (std::exception const& failure) {
    bool const isOfMedium = !arguments.fMedium.empty() && arguments.fAsJson && !HasWrittenOutput();
    if (isOfMedium) WriteOutput(FailureAsJson(kToMedia, StatusOf(failure), failure.what(), sample ? sample->fLabel : ""));
    if (PendingInterrupt() == 0) throw;
    std::cerr << "zep: " << Printable(failure.what()) << "\n";
    return StatusOf(failure);
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
      "of zep send. With --from it is that of the stored report, with --since that of zep diff; 66 when the stored report\n"
      "or the recording is refused, 73 when the page cannot be written.");
  return [arguments] {
    if (!arguments->fFrom.empty()) return ReportFrom(*arguments);
    return arguments->fSince.empty() ? Report(*arguments) : ReportSince(*arguments);
  };
}

}  // namespace NQRVZEP20::zep
