// zep run: a command, run as the library runs one.

#include "Commands.h"
#include "ExitStatus.h"
#include "Failure.h"
#include "Output.h"
#include "TOSSpecific.h"
#include "Text.h"

#include <CLI/CLI.hpp>

#include <iostream>
#include <limits>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

constexpr int kForEver = -1;

// The library tells only that a command failed, not how.
std::string WhyItFailed(std::string const& program, int timeout) {
  std::string reason = "zep: " + Printable(program) + " could not be executed, did not exit with 0 or was ended by a signal";
  if (timeout != kForEver) reason += ", or was silent for more than " + std::to_string(timeout) + " s and is left running";
  return reason + "\n";
}

int RunCommandLine(std::vector<std::string> commandLine, int timeout) {
  if (!commandLine.empty()) commandLine.erase(commandLine.begin());  // kCommandFollows
  if (commandLine.empty() || commandLine.front().empty()) throw TWrongUsage("there is no command to run");
  std::string const program = commandLine.front();
  commandLine.erase(commandLine.begin());
  std::string output;
  int const result = TOSSpecific::SpawnProcess(program, commandLine, output, timeout);
  WriteOutput(output);
  if (result == 0) return kExitComplete;
  std::cerr << WhyItFailed(program, timeout);
  return kExitNothing;
}

}  // namespace

TRun AddRunArguments(CLI::App& command) {
  auto const timeout = std::make_shared<int>(kForEver);
  command.add_option("--timeout", *timeout, "The longest silence allowed, in seconds; -1, the default, waits for ever")
      ->check(CLI::Range(kForEver, std::numeric_limits<int>::max()));
  command.prefix_command();  // all from the first word that is none of the options is the command's
  command.footer(
      "zep run [OPTIONS] [--] COMMAND [ARGUMENT]...\n"
      "What the command prints, on standard output and standard error, is printed when it has ended. A zero byte\n"
      "cuts off the rest of the chunk in which it came.\n"
      "Exit status: 0 when the command ran to its end and exited with 0, 1 when not, 64 for wrong usage.");
  return [&command, timeout] { return RunCommandLine(command.remaining(), *timeout); };
}

}  // namespace NQRVZEP20::zep
