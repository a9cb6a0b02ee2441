// zep report: which machine this is.

#include "Commands.h"
#include "Output.h"
#include "Report.h"
#include "Sample.h"

#include <CLI/CLI.hpp>

#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TArguments {
  bool fAsJson = false;
  bool fSample = false;
};

int Report(TArguments const& arguments) {
  if (arguments.fSample) SelectSample();
  TReport const report = MakeReport(LoadPlugIns());
  WriteOutput(arguments.fAsJson ? ReportAsJson(report) : ReportAsText(report));
  return report.fStatus;
}

}  // namespace

TRun AddReportArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TArguments>();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.add_flag("--sample", arguments->fSample, "Report on the bundled table of an invented server, labelled SAMPLE");
  command.footer(
      "Exit status: 0 when everything could be told, 2 when the report says what is missing, 1 when nothing\n"
      "could be told, 64 for wrong usage.");
  return [arguments] { return Report(*arguments); };
}

}  // namespace NQRVZEP20::zep
