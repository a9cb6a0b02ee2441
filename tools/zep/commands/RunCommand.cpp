// SPDX-License-Identifier: Apache-2.0

// zep run: runs a command in the same way as the library.

#include "TOSSpecific.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <unistd.h>

#include <CLI/CLI.hpp>

#include <cstdlib>
#include <iostream>
#include <limits>
#include <memory>
#include <sstream>

namespace NQRVZEP20::zep {

namespace {

constexpr int kForEver = -1;

struct TRunArguments {
  int fTimeoutSeconds = kForEver;
  bool fAsJson = false;
};

// Searches as execvp does, which has a search path of its own when PATH is missing.
bool IsFound(std::string const& program) {
  if (program.find('/') != program.npos) return ::access(program.c_str(), F_OK) == 0;
  char const* const path = std::getenv("PATH");
  if (path == nullptr) return true;
  std::istringstream directories(std::string(path) + ":");
  for (std::string directory; std::getline(directories, directory, ':');)
    if (::access(((directory.empty() ? "." : directory) + "/" + program).c_str(), F_OK) == 0) return true;
  return false;
}

// The library reports only that a command failed, not how.
std::string WhyItFailed(std::string const& program, int timeout) {
  if (!IsFound(program))
    return program.find('/') != program.npos ? program + " does not exist"
                                             : program + " was not found on PATH; is it spelled right, and installed?";
  std::string reason = program + " could not be executed, did not exit with status 0 or was killed by a signal";
  if (timeout != kForEver) reason += ", or was silent for more than " + std::to_string(timeout) + " s and is left running";
  return reason;
}

std::string AsJson(std::vector<std::string> const& commandLine, std::string const& output, std::string const& failure) {
  TJson document = DocumentHead("zep run", failure.empty() ? kExitComplete : kExitNothing, failure);
  document["command"] = commandLine;
  document["output"] = WithoutSecrets(output);
  return zep::AsText(document);
}

int RunCommandLine(std::vector<std::string> commandLine, TRunArguments const& arguments) {
  if (!commandLine.empty()) commandLine.erase(commandLine.begin());  // kCommandFollows
  if (commandLine.empty() || commandLine.front().empty()) throw TWrongUsage("there is no command to run");
  std::string const program = commandLine.front();
  std::string output;
  int const result =
      TOSSpecific::SpawnProcess(program, {commandLine.begin() + 1, commandLine.end()}, output, arguments.fTimeoutSeconds);
  std::string const failure = result == 0 ? "" : WhyItFailed(program, arguments.fTimeoutSeconds);
  WriteOutput(arguments.fAsJson ? AsJson(commandLine, output, failure) : WithoutSecrets(output));
  if (failure.empty()) return kExitComplete;
  std::cerr << "zep: " << Printable(failure) << "\n";
  return kExitNothing;
}

}  // namespace

TRun AddRunArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TRunArguments>();
  command
      .add_option("--timeout", arguments->fTimeoutSeconds,
                  "The longest time without output, in seconds; -1, the default, waits forever")
      ->check(CLI::Range(kForEver, std::numeric_limits<int>::max()));
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document, with the output in it");
  command.prefix_command();  // the first word that is not an option begins the command
  command.footer(
      "zep run [OPTIONS] [--] COMMAND [ARGUMENT]...\n"
      "The standard output and standard error of the command are printed after it has ended. A zero byte discards the rest\n"
      "of the chunk that contains it. Passwords in URLs, and passwords that were given to zep, are printed as ***.\n"
      "Exit status: 0 when the command exited with 0, 1 when it did not, 64 for wrong usage.");
  return [&command, arguments] { return RunCommandLine(command.remaining(), *arguments); };
}

}  // namespace NQRVZEP20::zep
