// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/ReportDelivery.h"

#include "collect/FailureOf.h"
#include "collect/redaction/Redaction.h"
#include "tools/zep/commands/StoredReports.h"
#include "tools/zep/media/TMountedMedium.h"
#include "tools/zep/output/FindingsText.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Question.h"
#include "tools/zep/output/ReportJson.h"
#include "tools/zep/output/ReportPhrases.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/transfer/ReportFileName.h"

#include <iostream>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

// Whether the findings make the command fail.
bool FailsBecauseOfFindings(TReport const& report, TReportArguments const& arguments) {
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
TJson WriteToMedium(TMadeReport const& made, TReportArguments const& arguments) {
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
TReportDocument PrintOrWrite(TMadeReport const& made, TReportArguments const& arguments) {
  if (!arguments.fMedium.empty()) return TReportDocument(WriteToMedium(made, arguments));
  if (arguments.fAsJson) return made.Document(EMessages::kWithoutSecrets);
  if (arguments.fHtmlFile.empty() && !arguments.fBundle.IsWanted()) WriteOutput(made.Text(arguments.fParts));
  return TReportDocument(TJson());
}

// Writes the page, if there is to be one. The failure of a report that is sent, too, is returned, so that it is still sent.
std::optional<TFailure> WritePage(TMadeReport const& made, TReportArguments const& arguments) {
  if (arguments.fHtmlFile.empty()) return std::nullopt;
  try {
    PrintOrWritePage(made.Stored(), arguments.fHtmlFile);
    return std::nullopt;
  } catch (TFailure const& failure) {
    if (arguments.fTarget.empty()) throw;
    return failure;
  }
}

void WriteBundleOf(TMadeReport const& made, TEvidence const& evidence, TReportArguments const& arguments) {
  TReportDocument const document = made.Document(EMessages::kWithoutSecrets);
  TBundleManifest const manifest = WriteBundle(arguments.fBundle, document.Text(), RedactedKinds(document.Members()), evidence);
  if (!arguments.fAsJson) WriteMessage(TextAbout(manifest, arguments.fBundle));
}

void PrintNumberOfSecrets(TReport const& report, TReportArguments const& arguments) {
  TReportDocument document(report, EMessages::kVerbatim);
  std::string const failure = FailureOf([&] {
    document.ReadInstances();
    std::string const contents = ContentsText(CountSecrets(std::move(document.Members())), arguments.fRedaction.fKinds);
    std::cerr << "zep: the report contains " << contents << "\n";
  });
  if (!failure.empty()) std::cerr << "zep: the secrets in the report cannot be counted: " << Printable(failure) << "\n";
}

// Prints the number of secrets in the report, and asks on a terminal whether it is to be sent.
bool IsSendingConfirmed(TReport const& report, TTarget const& target, TReportArguments const& arguments) {
  if (!arguments.fOptions.fQuiet) PrintNumberOfSecrets(report, arguments);
  return arguments.fIsConfirmed || IsConfirmed("zep: send it to " + target.fRemote.fHost + "?");
}

// A report that was not sent because the user did not want that, or interrupted the question.
TSentReport NotConfirmed() {
  TSentReport sent;
  sent.fTransferred.fOutcome =
      PendingInterrupt() != 0 ? Interrupted() : TOutcome{kZEPStatusFail, kExitNothing, "this was not confirmed"};
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

EExitStatus Send(TMadeReport const& made, TTarget const& target, TReportArguments const& arguments, TJson& document) {
  TSentReport const sent = IsSendingConfirmed(made.Report(), target, arguments)
                               ? SendReport(made.Document(EMessages::kVerbatim), target, arguments.fOptions)
                               : NotConfirmed();
  AddSending(document, sent);
  return sent.fTransferred.fOutcome.fExit;
}

}  // namespace

int Deliver(TMadeReport const& made, TEvidence const& evidence, TTarget const& target, TReportArguments const& arguments,
            std::optional<TInterruptGuard>& guard) {
  TReport const& report = made.Report();
  EExitStatus status = ExitStatusOf(report.fCompleteness);
  if (!arguments.fMedium.empty() && !guard) guard.emplace();
  auto const pageFailure = WritePage(made, arguments);
  if (arguments.fBundle.IsWanted()) WriteBundleOf(made, evidence, arguments);
  TReportDocument document = PrintOrWrite(made, arguments);
  if (!arguments.fTarget.empty()) {
    if (!guard) guard.emplace();
    EExitStatus const sent = Send(made, target, arguments, document.Members());
    if (sent != kExitComplete) status = sent;
  }
  bool const isDelivered = status == kExitComplete || status == kExitPartial;
  if (pageFailure) std::cerr << "zep: " << Printable(pageFailure->what()) << "\n";
  if (status == kExitComplete && !evidence.fFailure.empty())
    SetOutcome(document.Members(), status = kExitPartial, evidence.fFailure);
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

}  // namespace NQRVZEP20::zep
