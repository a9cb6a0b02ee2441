// zep report: which machine this is.

#include "Commands.h"
#include "Output.h"
#include "Report.h"
#include "Sample.h"
#include "SendReport.h"

#include <CLI/CLI.hpp>

#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TArguments {
  bool fAsJson = false;
  bool fSample = false;
  bool fBySftp = false;
  std::string fTarget;  // empty: nowhere
  TTransferOptions fOptions;
};

int Report(TArguments const& arguments) {
  TTarget target{};
  if (!arguments.fTarget.empty()) target = TargetOf(arguments.fTarget, arguments.fBySftp);
  if (arguments.fSample) SelectSample();
  TReport const report = MakeReport(LoadPlugIns());
  WriteOutput(arguments.fAsJson ? ReportAsJson(report) : ReportAsText(report));
  return arguments.fTarget.empty() ? report.fStatus : SendReport(report, target, arguments.fOptions);
}

}  // namespace

TRun AddReportArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TArguments>();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.add_flag("--sample", arguments->fSample, "Report on the bundled table of an invented server, labelled SAMPLE");
  command.add_option("--send", arguments->fTarget,
                     "Send the JSON document, packed, as well: ftp://[USER@]HOST[:PORT]/DIRECTORY/, sftp://..., or\n"
                     "[USER@]HOST[:PORT] alone. When it cannot be sent it is kept, and where is said");
  command.add_flag("--sftp", arguments->fBySftp, "Send to a host by SFTP instead of FTP");
  AddTransferOptions(command, arguments->fOptions);
  command.footer(
      "Exit status: 0 when everything could be told, 2 when the report says what is missing, 1 when nothing\n"
      "could be told, 64 for wrong usage; when it could not be sent, as that of zep send.");
  return [arguments] { return Report(*arguments); };
}

}  // namespace NQRVZEP20::zep
