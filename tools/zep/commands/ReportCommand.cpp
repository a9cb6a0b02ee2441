// SPDX-License-Identifier: Apache-2.0

// zep report: which machine this is.

#include "collect/FailureOf.h"
#include "collect/Report.h"
#include "collect/redaction/Redaction.h"
#include "collect/stored/StoredDocument.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/commands/Redacting.h"
#include "tools/zep/commands/StoredReports.h"
#include "tools/zep/commands/TMadeReport.h"
#include "tools/zep/commands/Thresholds.h"
#include "tools/zep/media/TMountedMedium.h"
#include "tools/zep/output/FindingsText.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Question.h"
#include "tools/zep/output/ReportJson.h"
#include "tools/zep/output/ReportPhrases.h"
#include "tools/zep/output/ReportText.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/recording/TReplay.h"
#include "tools/zep/transfer/ReportFileName.h"
#include "tools/zep/transfer/SendReport.h"

#include <CLI/CLI.hpp>

#include <iostream>
#include <memory>
#include <optional>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kJsonLines = "jsonl";
constexpr char const* kToMedia = "zep report --to-media";

struct TArguments {
  bool fAsJson = false;
  std::string fFormat;  // "text", "json" or "jsonl"; empty: as fAsJson says
  bool fSample = false;
  bool fBySftp = false;
  std::string fTarget;  // empty: nowhere
  TTransferOptions fOptions;
  TPlugInArguments fPlugIns;
  TReportParts fParts;
  TRedactionArguments fRedaction;
  bool fIsConfirmed = false;  // a report is sent without a question
  std::string fFailOn;        // a severity; empty for none
  std::string fFrom;          // a stored report; empty for this machine
  std::string fSince;         // a stored report to compare with; empty for none
  std::string fReplay;        // a recording; empty for this machine
  std::string fHtmlFile;      // the page to write; empty for none
  std::string fMedium;        // the device to write to; empty for standard output
};

// Whether the findings make the command fail.
bool FailsBecauseOfFindings(TReport const& report, TArguments const& arguments) {
  auto const worst = report.fFindings.Worst();
  return !arguments.fFailOn.empty() && worst && *worst >= *SeverityFrom(arguments.fFailOn);
}

// Returns the mount points at which the medium is still mounted. When writing fails or is interrupted, the medium is unmounted as
// well, and the exception of the writing is passed on.
std::vector<std::string> WriteAndUnmount(TMountedMedium const& medium, std::string const& name, std::string const& text) {
  try {
    medium.Write(name, text);
  } catch (std::runtime_error const&) {
    try {
      UnmountDirectory(medium.MountPoint());
    } catch (std::runtime_error const& failure) {
      std::cerr << "zep: " << Printable(failure.what()) << "\n";
    }
    throw;
  }
  try {
    return UnmountDirectory(medium.MountPoint());
  } catch (std::runtime_error const& failure) {
    throw std::runtime_error(name + " was written to " + medium.Device() + ", but " + failure.what());
  }
}

// Returns the document about the medium.
TJson WriteToMedium(TMadeReport const& made, TArguments const& arguments) {
  TReport const& report = made.Report();
  TReportDocument const contents = made.Document(EMessages::kVerbatim);
  std::string const name = ReportFileName(contents.Members(), arguments.fAsJson ? ".json" : ".txt");
  std::string const text = arguments.fAsJson ? contents.Text() : made.Text(arguments.fParts);
  TMountedMedium const medium(arguments.fMedium);
  std::vector<std::string> const stillMountedAt = WriteAndUnmount(medium, name, text);
  ThrowIfInterrupted(name + " was written to " + medium.Device() + ", which " + RemovalText(stillMountedAt));

  TJson document = DocumentHead(kToMedia, ExitStatusOf(report.fCompleteness), "", SampleLabelOf(report));
  document["reason"] = contents.Members().at("reason");  // which may be redacted
  document["device"] = medium.Device();
  document["file"] = name;
  document["bytes"] = text.size();
  document["stillMountedAt"] = stillMountedAt;
  if (!arguments.fAsJson)
    WriteMessage("The report is " + name + " on " + medium.Device() + ", which " + RemovalText(stillMountedAt) + ".\n");
  return document;
}

// Returns the document of the report, or of the medium to which it was written. Without --json the report is printed here.
TReportDocument PrintOrWrite(TMadeReport const& made, TArguments const& arguments) {
  if (!arguments.fMedium.empty()) return TReportDocument(WriteToMedium(made, arguments));
  if (arguments.fAsJson) return made.Document(EMessages::kWithoutSecrets);
  if (arguments.fHtmlFile.empty()) WriteOutput(made.Text(arguments.fParts));
  return TReportDocument(TJson());
}

// Writes the page, if there is to be one. The failure of a report that is sent, too, is returned, so that it is still sent.
std::optional<TFailure> WritePage(TMadeReport const& made, TArguments const& arguments) {
  if (arguments.fHtmlFile.empty()) return std::nullopt;
  try {
    PrintOrWritePage(made.Stored(), arguments.fHtmlFile);
    return std::nullopt;
  } catch (TFailure const& failure) {
    if (arguments.fTarget.empty()) throw;
    return failure;
  }
}

// Prints the number of secrets in the report, and asks on a terminal whether it is to be sent.
bool IsSendingConfirmed(TReport const& report, TTarget const& target, TArguments const& arguments) {
  TReportDocument document(report, EMessages::kVerbatim);
  std::string const failure = FailureOf([&] {
    document.ReadInstances();
    std::string const contents = ContentsText(CountSecrets(std::move(document.Members())), arguments.fRedaction.fKinds);
    if (!arguments.fOptions.fQuiet) std::cerr << "zep: the report contains " << contents << "\n";
  });
  if (!failure.empty()) std::cerr << "zep: the secrets in the report cannot be counted: " << Printable(failure) << "\n";
  return arguments.fIsConfirmed || IsConfirmed("zep: send it to " + target.fRemote.fHost + "?");
}

// A report that was not sent because the user did not want that.
TSentReport NotConfirmed() {
  TSentReport sent;
  sent.fTransferred.fOutcome = {kZEPStatusFail, kExitNothing, "this was not confirmed"};
  std::cerr << "zep: the report was not sent\n";
  return sent;
}

// Sets the exit status of the document, and why it is not 0.
void SetOutcome(TJson& document, EExitStatus status, std::string const& reason) {
  document["exitStatus"] = static_cast<int>(status);
  document["reason"] = reason;
}

// Adds the result of sending. A report that was not sent makes the command fail.
void AddSending(TJson& document, TSentReport const& sent) {
  TTransferred const& transferred = sent.fTransferred;
  bool const isSent = transferred.fOutcome.fExit == kExitComplete;
  if (!isSent) SetOutcome(document, transferred.fOutcome.fExit, ReasonOf(transferred));
  document["sent"] = {{"url", OrNull(transferred.fUrl)},
                      {"bytes", isSent ? TJson(transferred.fBytes) : TJson(nullptr)},
                      {"sha256", OrNull(transferred.fSha256)},
                      {"leftOnServer", transferred.fLeftOnServer},
                      {"keptIn", OrNull(sent.fKeptIn)}};
}

EExitStatus Send(TMadeReport const& made, TTarget const& target, TArguments const& arguments, TJson& document) {
  TSentReport const sent = IsSendingConfirmed(made.Report(), target, arguments)
                               ? SendReport(made.Document(EMessages::kVerbatim), target, arguments.fOptions)
                               : NotConfirmed();
  AddSending(document, sent);
  return sent.fTransferred.fOutcome.fExit;
}

// Prints or stores the report, and sends it if that was requested. The JSON document is printed last, because it contains the
// exit status. From the mounting of the medium on, and while the report is sent, `guard` holds back interrupts.
int Deliver(TMadeReport const& made, TTarget const& target, TArguments const& arguments, std::optional<TInterruptGuard>& guard) {
  TReport const& report = made.Report();
  EExitStatus status = ExitStatusOf(report.fCompleteness);
  if (!arguments.fMedium.empty() && !guard) guard.emplace();
  auto const pageFailure = WritePage(made, arguments);
  TReportDocument document = PrintOrWrite(made, arguments);
  if (!arguments.fTarget.empty()) {
    if (!guard) guard.emplace();
    EExitStatus const sent = Send(made, target, arguments, document.Members());
    if (sent != kExitComplete) status = sent;
  }
  bool const isDelivered = status == kExitComplete || status == kExitPartial;
  if (pageFailure) std::cerr << "zep: " << Printable(pageFailure->what()) << "\n";
  if (pageFailure && isDelivered)
    SetOutcome(document.Members(), status = pageFailure->fStatus, pageFailure->what());
  else if (isDelivered && FailsBecauseOfFindings(report, arguments))
    SetOutcome(document.Members(), status = kExitFindings, CountsOf(report.fFindings));
  if (arguments.fFormat == kJsonLines)
    document.WriteLines(WriteOutput);
  else if (arguments.fAsJson)
    document.Write(WriteOutput);
  return status;
}

int ReportFrom(TArguments const& arguments) {
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

TReport ReportHere(std::optional<TSample> const& sample, TArguments const& arguments) {
  return MakeReport(LoadPlugInsFor(arguments.fPlugIns, sample), sample, {ThresholdSettings()});
}

// Both reports are redacted with the same map, so that they differ only where their originals do.
int ReportSince(TArguments const& arguments) {
  TStoredReport const before = ReadReport(arguments.fSince, arguments.fRedaction);
  auto const sample = SampleIf(arguments.fSample);
  TStoredReport const now = TMadeReport(ReportHere(sample, arguments), arguments.fRedaction).Stored();
  return PrintDifferences("zep report --since", before, now, {arguments.fAsJson, arguments.fHtmlFile});
}

// The report on the machine that `replay` makes the plug-ins read.
TReport ReportOn(TReplay const& replay, TArguments const& arguments) {
  auto const files = replay.Choose(FindPlugInsFor(arguments.fPlugIns));
  TReport report = MakeReport(LoadPlugInsFor(arguments.fPlugIns, std::nullopt, files), std::nullopt, {ThresholdSettings()});
  report.fRecorded = replay.Index().fTime;
  return report;
}

// Prints the message of an interrupted run itself: the signal ends zep when `guard` ends.
int Report(TArguments const& arguments) {
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

// With a stored report, no option may say how to make or deliver one.
void AddStoredOptions(CLI::App& command, TArguments& arguments) {
  auto* const from = command.add_option("--from", arguments.fFrom, "Print this stored report, the output of zep report --json");
  auto* const since =
      command.add_option("--since", arguments.fSince, "Print only what changed since this stored report, like zep diff");
  from->type_name("FILE")->excludes(since);
  since->type_name("FILE");
  for (char const* other : {"--section", "--full", "--format", "--to-media", "--send", "--fail-on"}) {
    from->excludes(command.get_option(other));
    since->excludes(command.get_option(other));
  }
  for (char const* other : {"--sample", "--plugin"}) from->excludes(command.get_option(other));
  command
      .add_option("--replay", arguments.fReplay,
                  "Report on the machine of this recording, the output of zep record, instead of this machine")
      ->type_name("FILE")
      ->excludes(from)
      ->excludes(since)
      ->excludes(command.get_option("--sample"));
  for (char const* other : {"--to-media", "--section", "--full"})
    command.get_option("--html")->excludes(command.get_option(other));
}

}  // namespace

TRun AddReportArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TArguments>();
  auto* const json = command.add_flag("--json", arguments->fAsJson, "Print one JSON document, with every instance");
  auto* const format =
      command
          .add_option_function<std::string>(
              "--format",
              [arguments](std::string const& name) {
                arguments->fFormat = name;
                arguments->fAsJson = name != "text";
              },
              "text, json (the same as --json), or jsonl: the document without instances on one line, then a line for each\n"
              "instance, and a line with their number")
          ->check(CLI::IsMember({"text", "json", kJsonLines}).description("text, json or jsonl"))
          ->type_name("NAME")
          ->excludes(json);
  command.add_option("--section", arguments->fParts.fSections, "Print only this section (repeatable)")
      ->check(CLI::IsMember(SectionNames()).description(Joined(SectionNames(), ", ")))
      ->type_name("NAME")
      ->excludes(json)
      ->excludes(format);
  command.add_flag("--full", arguments->fParts.fAllInstances, "Also print every instance with all its properties")
      ->excludes(json)
      ->excludes(format);
  command.add_flag("--sample", arguments->fSample, "Report on the bundled sample, an invented server, labelled SAMPLE");
  command.add_option(
      "--to-media", arguments->fMedium,
      "Write the report to a file on this removable device, such as /dev/sdb, instead of printing it, and\nunmount the device");
  command.add_option("--send", arguments->fTarget,
                     "Also send the JSON document, compressed: ftp://[USER@]HOST[:PORT]/DIRECTORY/, sftp://..., or\n"
                     "[USER@]HOST[:PORT] alone. A report that cannot be sent is kept in a file, whose path is printed");
  command.add_flag("--sftp", arguments->fBySftp, "Use SFTP instead of FTP for a target without ftp:// or sftp://");
  command.add_option("--fail-on", arguments->fFailOn, "Exit with status 3 if a finding has this severity or a worse one")
      ->check(
          CLI::IsMember({"information", "warning", "error", "critical"}).description("information, warning, error or critical"))
      ->type_name("SEVERITY");
  command
      .add_option("--html", arguments->fHtmlFile,
                  "Write the report as a page to this file, which needs no other file, instead of printing it as text")
      ->type_name("FILE");
  command.add_flag("--yes", arguments->fIsConfirmed, "Send without a question on the terminal");
  AddUploadOptions(command, arguments->fOptions);
  AddRedactionOptions(command, arguments->fRedaction);
  AddPlugInOptions(command, arguments->fPlugIns);
  AddStoredOptions(command, *arguments);
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
