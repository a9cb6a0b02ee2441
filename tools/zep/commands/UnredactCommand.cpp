// SPDX-License-Identifier: Apache-2.0

// zep unredact: the original of a redacted report.

#include "collect/redaction/Redaction.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/StoredReports.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/secrets/RedactionMap.h"

#include <CLI/CLI.hpp>

#include <memory>

namespace NQRVZEP20::zep {

namespace {

int Unredacted(std::string const& file, std::string const& map) {
  try {
    TJson document = ReadDocument(file);
    Unredact(document, ReadRedactionMap(map.empty() ? UsualRedactionMap() : map));
    WriteOutput(AsVerbatimText(document));
    return kExitComplete;
  } catch (TRedactionError const& failure) {
    throw TFailure(kExitNoInput, file + ": " + failure.what());
  }
}

}  // namespace

TRun AddUnredactArguments(CLI::App& command) {
  struct TUnredactArguments {
    std::string fFile, fMap;
    bool fAsJson = false;
  };
  auto const arguments = std::make_shared<TUnredactArguments>();
  command.add_option("file", arguments->fFile, "The redacted report, a file with the output of zep report --json --redact")
      ->required();
  command
      .add_option("--map", arguments->fMap, "The map that zep report wrote. Without it, ~/.local/state/zep/redaction-map.json")
      ->type_name("FILE");
  command.add_flag("--json", arguments->fAsJson, "Also print a failure as a JSON document; the report is one in any case");
  command.footer(
      "Exit status: 0 when the original was printed, 64 for wrong usage, 66 when the report or the map cannot be read, is\n"
      "altered, or does not belong to the other.");
  return [arguments] { return Unredacted(arguments->fFile, arguments->fMap); };
}

}  // namespace NQRVZEP20::zep
