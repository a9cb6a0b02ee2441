// SPDX-License-Identifier: Apache-2.0

// zep diff: what changed between two stored reports.

#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/StoredReports.h"

#include <CLI/CLI.hpp>

#include <memory>
#include <utility>

namespace NQRVZEP20::zep {

TRun AddDiffArguments(CLI::App& command) {
  struct TDiffArguments {
    std::string fBefore, fAfter;
    TDifferenceOutput fOutput;
  };
  auto const arguments = std::make_shared<TDiffArguments>();
  command.add_option("before", arguments->fBefore, "The earlier report, a file with the output of zep report --json")->required();
  command.add_option("after", arguments->fAfter, "The later report")->required();
  command.add_flag("--json", arguments->fOutput.fAsJson, "Print one JSON document");
  command.add_option("--html", arguments->fOutput.fHtmlFile, "Write the differences as a page to this file")->type_name("FILE");
  command.footer(
      "Exit status: 0 when the reports are the same, 1 when they differ, 2 when they are the same as far as they could be\n"
      "compared, 64 for wrong usage, 66 when a file cannot be read or is not a report, 73 when the page cannot be written.");
  return [arguments] {
    TStoredReport before = ReadReport(arguments->fBefore);
    return PrintDifferences("zep diff", std::move(before), ReadReport(arguments->fAfter), arguments->fOutput);
  };
}

}  // namespace NQRVZEP20::zep
