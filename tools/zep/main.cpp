// zep: the reference front end. One program with subcommands, each in a file of its own.

#include "Commands.h"
#include "ExitStatus.h"
#include "Failure.h"
#include "Text.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <exception>
#include <iostream>
#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

constexpr TCommand kCommands[] = {
    {"report", "Tell which machine this is", AddReportArguments},
    {"show", "Print one object or class of the providers' namespaces, or of a MOF file", AddShowArguments},
    {"classes", "List the classes of the providers' namespaces, or of a MOF file", AddClassesArguments},
    {"mof", "Load and check a schema in MOF", AddMofArguments},
    {"media", "List, mount and unmount removable media", AddMediaArguments},
    {"config", "Show the settings of zep.cfg as the library reads them", AddConfigArguments},
    {"remote", "Tell which machines are behind management controllers", AddRemoteArguments},
    {"run", "Run a command as the library runs one, and print its output", AddRunArguments},
    {"send", "Send a file to an FTP or SFTP server", AddSendArguments},
    {"get", "Fetch a file from an FTP or SFTP server", AddGetArguments},
    {"proxy-check", "Tell whether a web proxy lets requests through", AddProxyCheckArguments},
    {"wpad", "Find the proxy configuration file that the DHCP server names", AddWpadArguments},
};

// The arguments, the last one first, as CLI11 takes them. It would hand what stands behind "--" to zep itself: of
// "zep run [OPTIONS] -- COMMAND" the mark is left out, and the command begins all the same.
std::vector<std::string> ArgumentsOf(int argc, char const* const* argv) {
  std::vector<std::string> arguments(argv + 1, argv + argc);
  if (!arguments.empty() && arguments.front() == "run") {
    auto word = arguments.begin() + 1;
    while (word != arguments.end() && word->rfind('-', 0) == 0 && *word != "--")
      word += *word == "--timeout" && word + 1 != arguments.end() ? 2 : 1;
    if (word != arguments.end() && *word == "--") arguments.erase(word);
  }
  std::reverse(arguments.begin(), arguments.end());
  return arguments;
}

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
    app.parse(ArgumentsOf(argc, argv));
  } catch (CLI::ExtrasError const& stop) {
    bool const maySayPassword = std::string(stop.what()).find('@') != std::string::npos;
    if (maySayPassword) throw TWrongUsage("there are arguments too many");
    app.exit(stop, std::cout, std::cerr);
    return kExitUsage;
  } catch (CLI::ParseError const& stop) {
    bool const isAnswered = app.exit(stop, std::cout, std::cerr) == 0;  // --help, --version
    return isAnswered ? kExitComplete : kExitUsage;
  }
  return runs.at(app.get_subcommands().front())();
}

}  // namespace

}  // namespace NQRVZEP20::zep

int main(int argc, char** argv) try {
  return NQRVZEP20::zep::Run(argc, argv);
} catch (NQRVZEP20::zep::TWrongUsage const& failure) {
  std::cerr << "zep: " << NQRVZEP20::zep::Printable(failure.what()) << '\n';
  return NQRVZEP20::zep::kExitUsage;
} catch (std::exception const& failure) {
  std::cerr << "zep: " << NQRVZEP20::zep::Printable(failure.what()) << '\n';
  return NQRVZEP20::zep::kExitNothing;
}
