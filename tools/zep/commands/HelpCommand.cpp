// SPDX-License-Identifier: Apache-2.0

// zep help: how zep, or one of its commands, is called.

#include "tools/zep/commands/Commands.h"
#include "tools/zep/completion/Completion.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"

#include <CLI/CLI.hpp>

#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct THelpArguments {
  std::vector<std::string> fCommand;  // "media mount"; empty for zep itself
  std::string fShell;                 // whose completion is printed; empty for help
  bool fAsJson = false;
};

// A word that is not a command may be a password, and is not repeated.
std::string HelpOf(CLI::App const& zep, std::vector<std::string> const& words) {
  CLI::App const* command = &zep;
  std::string before;
  for (std::string const& word : words) {
    before += (before.empty() ? "" : " ") + command->get_name();
    command = CommandNamed(*command, word);
    if (command == nullptr) throw TWrongUsage("unknown command; zep --help lists all commands");
  }
  auto const formatter = std::dynamic_pointer_cast<CLI::Formatter>(command->get_formatter());
  return formatter->make_help(command, before.empty() ? command->get_name() : before + " " + command->get_name(),
                              CLI::AppFormatMode::Normal);
}

int Help(CLI::App const& zep, THelpArguments const& arguments) {
  bool const isHelp = arguments.fShell.empty();
  if (!isHelp && !arguments.fCommand.empty()) throw TWrongUsage("--completion is for all commands together");
  std::string const text = isHelp ? HelpOf(zep, arguments.fCommand) : CompletionFor(arguments.fShell, zep);
  TJson document = DocumentHead("zep help", kExitComplete, "");
  document["text"] = text;
  WriteOutput(arguments.fAsJson ? zep::AsText(document) : text);
  return kExitComplete;
}

}  // namespace

CLI::App const* CommandNamed(CLI::App const& app, std::string const& name) {
  for (CLI::App const* const command : app.get_subcommands({}))
    if (command->get_name() == name) return command;
  return nullptr;
}

TRun AddHelpArguments(CLI::App& command) {
  auto const arguments = std::make_shared<THelpArguments>();
  command.add_option("command", arguments->fCommand, "The command; without one, all commands are listed");
  command
      .add_option("--completion", arguments->fShell,
                  "Print the script with which this shell completes the command line of zep, instead of the help")
      ->check(CLI::IsMember(ShellsWithCompletion()).description("bash, fish or zsh"))
      ->type_name("SHELL");
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document, with the text in it");
  command.footer(
      "The same as zep --help and zep COMMAND --help.\n"
      "Exit status: 0, or 64 for an unknown command.");
  return [zep = command.get_parent(), arguments] { return Help(*zep, *arguments); };
}

}  // namespace NQRVZEP20::zep
