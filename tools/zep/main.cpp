// SPDX-License-Identifier: Apache-2.0

// zep: the reference front end. One program with subcommands, each in a file of its own.

#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/TScratchDirectory.h"
#include "tools/zep/processes/WriteWhole.h"
#include "tools/zep/secrets/Password.h"
#include "tools/zep/secrets/Secrets.h"

#include <fcntl.h>
#include <signal.h>
#include <unistd.h>
#include <CLI/CLI.hpp>

#include <algorithm>
#include <cctype>
#include <exception>
#include <iostream>
#include <map>
#include <new>
#include <sstream>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kIsEmpty = " must not be empty";

constexpr TCommand kCommands[] = {
    {"report", "Report the identity and the hardware of this machine", AddReportArguments},
    {"record", "Record what the plug-ins read of this machine, for zep report --replay", AddRecordArguments},
    {"diff", "Compare two stored reports", AddDiffArguments},
    {"show", "Print one object or class of the providers' namespaces, or of a MOF file", AddShowArguments},
    {"classes", "List the classes of the providers' namespaces, or of a MOF file", AddClassesArguments},
    {"plugins", "List the plug-ins, and why files are not loaded as plug-ins", AddPluginsArguments},
    {"mof", "Load and check a schema in MOF", AddMofArguments},
    {"doctor", "Check what works on this host, and name the remedy for what does not", AddDoctorArguments},
    {"plugin", "Write the project of a new provider plug-in, or check a plug-in", AddPluginArguments},
    {"media", "List, mount and unmount removable media", AddMediaArguments},
    {"config", "Show the settings of zep.cfg as the library reads them", AddConfigArguments},
    {"remote", "Identify servers through their management controllers", AddRemoteArguments},
    {"run", "Run a command in the same way as the library, and print its output", AddRunArguments},
    {"send", "Send a file to an FTP or SFTP server", AddSendArguments},
    {"get", "Fetch a file from an FTP or SFTP server", AddGetArguments},
    {"proxy-check", "Check whether a web proxy lets requests through", AddProxyCheckArguments},
    {"unredact", "Print the original of a redacted report", AddUnredactArguments},
    {"verify", "Check a bundle of zep report, and who signed it", AddVerifyArguments},
    {"wpad", "Find the proxy configuration file that the DHCP server names", AddWpadArguments},
    {"help", "List the commands, or describe one", AddHelpArguments},
};

// The name of the option, without the value of "--name=value" or "-nvalue".
std::string NameOfOption(std::string const& word) {
  return word.rfind("--", 0) == 0 ? word.substr(0, word.find('=')) : word.substr(0, 2);
}

// The number of leading words that zep itself reads: those before "--", and of "zep run [OPTIONS] COMMAND" those before the
// command.
std::size_t WordsOfZep(std::vector<std::string> const& words) {
  bool const isRun = !words.empty() && words.front() == "run";
  std::size_t at = isRun ? 1 : 0;
  while (at < words.size() && words[at] != "--" && (!isRun || words[at].rfind('-', 0) == 0))
    at += isRun && words[at] == "--timeout" && at + 1 < words.size() ? 2 : 1;
  return at;
}

// The arguments in reverse order, as CLI11 expects them. CLI11 would read the next word as the value of "--send=", would read the
// words after the "--" of "zep run" as options, and would accept "--json=false".
std::vector<std::string> ArgumentsOf(std::vector<std::string> words) {
  std::size_t const end = WordsOfZep(words);
  for (std::size_t at = 0; at < end; ++at) {
    if (words[at].rfind("--", 0) == 0 && words[at].find('=') == words[at].size() - 1)
      throw TWrongUsage(NameOfOption(words[at]) + kIsEmpty);
    if (words[at].rfind("--json=", 0) == 0) throw TWrongUsage("--json takes no value");
  }
  if (end < words.size() && words.front() == "run") {
    if (words[end] == "--") words.erase(words.begin() + static_cast<std::ptrdiff_t>(end));
    words.insert(words.begin() + static_cast<std::ptrdiff_t>(end), kCommandFollows);
  }
  std::reverse(words.begin(), words.end());
  return words;
}

// The command, or the command of a command, that the words name.
CLI::App const& ChosenOf(CLI::App const& app) {
  auto const chosen = app.get_subcommands();
  return chosen.empty() ? app : ChosenOf(*chosen.front());
}

// An option that needs no value, such as --redact, has an empty one without it.
void CheckForEmpty(CLI::App const& app) {
  for (CLI::Option const* const option : app.get_options())
    for (std::string const& value : option->results())
      if (value.empty() && option->get_expected_min() > 0) throw TWrongUsage(option->get_name() + kIsEmpty);
  for (CLI::App const* const chosen : app.get_subcommands()) CheckForEmpty(*chosen);
}

// The words that are neither options nor arguments of the command.
std::vector<std::string> ExtrasOf(CLI::App const& app) {
  std::vector<std::string> words = app.remaining(true);
  if (app.got_subcommand("run")) words.erase(std::find(words.begin(), words.end(), kCommandFollows), words.end());
  words.erase(std::remove(words.begin(), words.end(), "--"), words.end());
  return words;
}

bool IsOption(std::string const& word) { return word.size() > 1 && word.front() == '-'; }

bool HasOnlyLetters(std::string const& word) {
  return std::all_of(word.begin(), word.end(), [](unsigned char c) { return std::isalpha(c) != 0; });
}

// An unknown word may be a password, so only names of options and words of letters are repeated.
void CheckForExtras(CLI::App const& app) {
  std::vector<std::string> const words = ExtrasOf(app);
  if (words.empty()) return;
  bool const isCommand = !ChosenOf(app).get_subcommands({}).empty() && !IsOption(words.front());
  if (isCommand && HasOnlyLetters(words.front())) throw TWrongUsage("unknown command \"" + words.front() + "\"");
  if (isCommand) throw TWrongUsage("unknown command");
  auto const option = std::find_if(words.begin(), words.end(), IsOption);
  if (option != words.end()) throw TWrongUsage("unknown option " + NameOfOption(*option));
  throw TWrongUsage(words.size() == 1 ? "one unexpected argument" : std::to_string(words.size()) + " unexpected arguments");
}

// The three messages of CLI11 for a value that an option does not accept; they contain the value.
bool IsAbout(std::string const& message, std::string const& option) {
  std::string const end = " is not an allowed value for " + option;
  return message.rfind(option + ": ", 0) == 0 || message.rfind("Could not convert: " + option + " = ", 0) == 0 ||
         (message.size() > end.size() && message.compare(message.size() - end.size(), end.size(), end) == 0);
}

std::string WhyNoValue(CLI::App const& chosen, std::string const& message) {
  for (CLI::Option const* const option : chosen.get_options())
    if (IsAbout(message, option->get_name())) {
      std::string const type = option->get_type_name();  // "INT:INT in [1 - 1000]"
      return option->get_name() + " takes " + (type.empty() ? "no value" : type.substr(type.find(':') + 1));
    }
  return "the value of an option is invalid";
}

// Messages of CLI11 about values repeat the value, which may be a password; the others name the option or the command.
std::string WhyRefused(CLI::App const& app, CLI::ParseError const& refusal) {
  CLI::App const& chosen = ChosenOf(app);
  std::string const message = refusal.what();
  if (&chosen == &app && dynamic_cast<CLI::RequiredError const*>(&refusal))
    return "a command is required; zep --help lists all commands";
  bool const isOfValue =
      dynamic_cast<CLI::ValidationError const*>(&refusal) || dynamic_cast<CLI::ConversionError const*>(&refusal);
  return isOfValue ? WhyNoValue(chosen, message) : message;
}

// Writes help and version like any other output.
int Answer(CLI::App const& app, CLI::Success const& question) {
  std::ostringstream answer;
  app.exit(question, answer, answer);
  WriteOutput(answer.str());
  return kExitComplete;
}

using TRuns = std::map<CLI::App const*, TRun>;

TRuns AddCommands(CLI::App& app) {
  TRuns runs;
  app.set_version_flag("--version", "zep " ZEP_VERSION " (build " ZEP_BUILD_ID ")");
  app.require_subcommand(1);
  app.footer("zep COMMAND --help describes a command.");
  for (TCommand const& command : kCommands) {
    CLI::App* const added = app.add_subcommand(command.fName, command.fDescription);
    runs[added] = command.fAddArguments(*added);
  }
  return runs;
}

int Run(CLI::App& app, TRuns const& runs, std::vector<std::string> const& words) {
  try {
    app.parse(ArgumentsOf(words));
  } catch (CLI::Success const& question) {
    return Answer(app, question);
  } catch (CLI::ParseError const& refusal) {
    CheckForEmpty(app);
    CheckForExtras(app);
    throw TWrongUsage(WhyRefused(app, refusal));
  }
  CheckForEmpty(app);
  CheckForExtras(app);
  return runs.at(app.get_subcommands().front())();
}

// "zep remote" uses the password; a command of "zep run" may print it, having read it elsewhere.
bool IsControllersPasswordNeeded(std::vector<std::string> const& words) {
  return std::any_of(words.begin(), words.end(), [](std::string const& word) { return word == "remote" || word == "run"; });
}

// Called first, before anything is printed.
void KeepSecrets(std::vector<std::string> const& words) {
  TakePasswordOutOfTheEnvironment(IsControllersPasswordNeeded(words));
  static TGuardedErrors const errors;  // to the end of the program
  for (std::string const& word : words) HideIn(word);
}

// ---- Failures ----

// Reads the words, because CLI11 may have stopped before the option.
bool IsJsonWanted(std::vector<std::string> const& words) {
  for (std::size_t at = 0; at < WordsOfZep(words); ++at) {
    std::string const& word = words[at];
    bool const isFormat = at > 0 && words[at - 1] == "--format" && word.rfind("json", 0) == 0;
    if (word == "--json" || isFormat || word.rfind("--format=json", 0) == 0) return true;
  }
  return false;
}

// "zep media mount"; "zep" when the first word is not a command. Also from the words.
std::string NameOfDocument(CLI::App const& app, std::vector<std::string> const& words) {
  std::string name = app.get_name();
  CLI::App const* command = words.empty() ? nullptr : CommandNamed(app, words.front());
  if (command != nullptr) name += " " + command->get_name();
  for (std::size_t at = 1; command != nullptr && at < WordsOfZep(words); ++at)
    if (CLI::App const* const below = CommandNamed(*command, words[at])) {
      command = below;
      if (command->get_name() != kListMedia) name += " " + command->get_name();
    }
  return name;
}

// Prints no second document when one was printed, even in part.
void WriteFailure(std::string const& document, EExitStatus status, std::string const& reason) {
  if (HasWrittenOutput()) return;
  std::string const why = FailureOf([&] { WriteOutput(FailureAsJson(document, status, reason)); });
  if (!why.empty()) std::cerr << "zep: " << Printable(why) << '\n';
}

std::string WhyOf(std::exception const& failure) {
  return dynamic_cast<std::bad_alloc const*>(&failure) != nullptr ? "not enough memory" : failure.what();
}

// Signal settings are inherited. From a caller that ignores SIGCHLD, as some services do, zep could not get the exit status of
// its children; from one that blocks the signals that end a program, only SIGKILL would end zep. SIGPIPE remains as the caller
// set it (Output.h).
void SetSignals() {
  ::signal(SIGCHLD, SIG_DFL);
  sigset_t signals;
  ::sigemptyset(&signals);
  for (int const signal : {SIGINT, SIGTERM, SIGHUP, SIGCHLD}) ::sigaddset(&signals, signal);
  ::sigprocmask(SIG_UNBLOCK, &signals, nullptr);
}

int RunOrFail(std::vector<std::string> const& words) {
  CLI::App app("zep reports on this server through the provider plug-ins in the directory of libzepcore.so.", "zep");
  TRuns const runs = AddCommands(app);
  try {
    return Run(app, runs, words);
  } catch (std::exception const& failure) {
    std::string const why = WhyOf(failure);
    std::cerr << "zep: " << Printable(why) << '\n';
    if (IsJsonWanted(words)) WriteFailure(NameOfDocument(app, words), StatusOf(failure), why);
    return StatusOf(failure);
  }
}

// Where the caller has closed standard input, output or error, no file that zep opens may take its place. Writing to these still
// fails.
void FillStandardDescriptors() {
  int fd = -1;
  while ((fd = ::open("/dev/null", O_RDONLY)) >= 0 && fd <= STDERR_FILENO) continue;
  if (fd > STDERR_FILENO) ::close(fd);
}

// Without this, zep would end with a core dump where an exception cannot be caught: there is no memory for the message, or a
// destructor of the JSON library needs some.
void SetEndWithoutMemory() {
  static pid_t const process = ::getpid();  // a plug-in, which runs in a child, ends as it does in any other program
  static std::terminate_handler const usual = std::set_terminate([] {
    try {
      if (::getpid() == process && std::current_exception()) std::rethrow_exception(std::current_exception());
    } catch (std::bad_alloc const&) {
      WriteWhole(STDERR_FILENO, "zep: not enough memory\n");
      TScratchDirectory::RemoveAll();
      ::_exit(kExitNothing);
    } catch (...) {
    }
    usual();
  });
}

}  // namespace

}  // namespace NQRVZEP20::zep

int main(int argc, char** argv) {
  using namespace NQRVZEP20::zep;
  SetEndWithoutMemory();
  FillStandardDescriptors();
  SetSignals();
  std::vector<std::string> const words(argv + 1, argv + argc);
  KeepSecrets(words);
  return RunOrFail(words);
}
