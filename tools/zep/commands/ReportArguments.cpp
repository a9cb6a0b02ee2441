// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/ReportArguments.h"

#include "collect/Sections.h"
#include "tools/zep/output/Text.h"

#include <CLI/CLI.hpp>

namespace NQRVZEP20::zep {

namespace {

void AddFormatOptions(CLI::App& command, TReportArguments& arguments) {
  auto* const json = command.add_flag("--json", arguments.fAsJson, "Print one JSON document, with every instance");
  auto* const format =
      command
          .add_option_function<std::string>(
              "--format",
              [&arguments](std::string const& name) {
                arguments.fFormat = name;
                arguments.fAsJson = name != "text";
              },
              "text, json (the same as --json), or jsonl: the document without instances on one line, then a line for each\n"
              "instance, and a line with their number")
          ->check(CLI::IsMember({"text", "json", kJsonLines}).description("text, json or jsonl"))
          ->type_name("NAME")
          ->excludes(json);
  command.add_option("--section", arguments.fParts.fSections, "Print only this section (repeatable)")
      ->check(CLI::IsMember(SectionNames()).description(Joined(SectionNames(), ", ")))
      ->type_name("NAME")
      ->excludes(json)
      ->excludes(format);
  command.add_flag("--full", arguments.fParts.fAllInstances, "Also print every instance with all its properties")
      ->excludes(json)
      ->excludes(format);
}

void AddDeliveryOptions(CLI::App& command, TReportArguments& arguments) {
  command.add_option(
      "--to-media", arguments.fMedium,
      "Write the report to a file on this removable device, such as /dev/sdb, instead of printing it, and\nunmount the device");
  command.add_option("--send", arguments.fTarget,
                     "Also send the JSON document, compressed: ftp://[USER@]HOST[:PORT]/DIRECTORY/, sftp://..., or\n"
                     "[USER@]HOST[:PORT] alone. A report that cannot be sent is kept in a file, whose path is printed");
  command.add_flag("--sftp", arguments.fBySftp, "Use SFTP instead of FTP for a target without ftp:// or sftp://");
  command.add_option("--fail-on", arguments.fFailOn, "Exit with status 3 if a finding has this severity or a worse one")
      ->check(
          CLI::IsMember({"information", "warning", "error", "critical"}).description("information, warning, error or critical"))
      ->type_name("SEVERITY");
  command
      .add_option("--html", arguments.fHtmlFile,
                  "Write the report as a page to this file, which needs no other file, instead of printing it as text")
      ->type_name("FILE");
}

// With a stored report, no option may say how to make or deliver one.
void AddStoredOptions(CLI::App& command, TReportArguments& arguments) {
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

void AddReportOptions(CLI::App& command, TReportArguments& arguments) {
  AddFormatOptions(command, arguments);
  command.add_flag("--sample", arguments.fSample, "Report on the bundled sample, an invented server, labelled SAMPLE");
  AddDeliveryOptions(command, arguments);
  command.add_flag("--yes", arguments.fIsConfirmed, "Send without a question on the terminal");
  AddUploadOptions(command, arguments.fOptions);
  AddRedactionOptions(command, arguments.fRedaction);
  AddPlugInOptions(command, arguments.fPlugIns);
  AddStoredOptions(command, arguments);
  AddBundleOptions(command, arguments.fBundle);
}

}  // namespace NQRVZEP20::zep
