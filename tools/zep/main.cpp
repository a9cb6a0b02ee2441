// zep: the reference front end. One program with subcommands, each in a file of its own.

#include "Commands.h"
#include "ExitStatus.h"

#include <CLI/CLI.hpp>

#include <exception>
#include <iostream>
#include <map>
#include <string>

namespace NQRVZEP20::zep {

namespace {

constexpr TCommand kCommands[] = {
    {"report", "Tell which machine this is", AddReportArguments},
    {"show", "Print one object or class of the providers' namespaces, or of a MOF file", AddShowArguments},
    {"classes", "List the classes of the providers' namespaces, or of a MOF file", AddClassesArguments},
    {"mof", "Load and check a schema in MOF", AddMofArguments},
    {"config", "Show the settings of zep.cfg as the library reads them", AddConfigArguments},
    {"run", "Run a command as the library runs one, and print its output", AddRunArguments},
};

int Run(int argc, char const* const* argv) {
  CLI::App app("zep tells what a server knows of itself, through the provider plug-ins beside libzepcore.so.", "zep");
  app.set_version_flag("--version", "zep " ZEP_VERSION " (build " ZEP_BUILD_ID ")");
  app.require_subcommand(1);
  app.footer("zep COMMAND --help tells more of a command.");

  std::map<CLI::App const*, TRun> runs;
  for (TCommand const& command : kCommands) {
    CLI::App* const added = app.add_subcommand(command.fName, command.fDescription);
    runs[added] = command.fAddArguments(*added);
  }

  try {
    app.parse(argc, argv);
  } catch (CLI::ParseError const& stop) {
    bool const isAnswered = app.exit(stop, std::cout, std::cerr) == 0;  // --help, --version
    return isAnswered ? kExitComplete : kExitUsage;
  }
  return runs.at(app.get_subcommands().front())();
}

}  // namespace

}  // namespace NQRVZEP20::zep

int main(int argc, char** argv) try { return NQRVZEP20::zep::Run(argc, argv); } catch (std::exception const& failure) {
  std::cerr << "zep: " << failure.what() << '\n';
  return NQRVZEP20::zep::kExitNothing;
}
