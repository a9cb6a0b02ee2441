// zep get: a file from an FTP or SFTP server.

#include "Commands.h"
#include "Failure.h"
#include "Text.h"
#include "Transfer.h"

#include <unistd.h>

#include <CLI/CLI.hpp>

#include <filesystem>
#include <iostream>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TArguments {
  std::string fUrl, fFile;
  bool fForce = false, fNoClobber = false, fAsJson = false;
  TTransferOptions fOptions;
};

bool IsThere(std::string const& file) { return std::filesystem::exists(std::filesystem::symlink_status(file)); }

bool IsOverwritingWanted(std::string const& file) {
  std::cerr << "zep: " << Printable(file) << " exists; overwrite it? (y/n): " << std::flush;
  std::string answer;
  std::getline(std::cin, answer);
  return answer == "y" || answer == "Y";
}

// Why the file may not be written; empty when it may. Asks only where somebody can answer.
std::string WhyNotWritten(TArguments const& arguments) {
  std::string const& file = arguments.fFile;
  if (std::filesystem::is_directory(file)) return Printable(file) + " is a directory";
  if (arguments.fForce || !IsThere(file)) return "";
  if (!arguments.fNoClobber && ::isatty(STDIN_FILENO))
    return IsOverwritingWanted(file) ? "" : Printable(file) + " is left as it is";
  return Printable(file) + " exists" + (arguments.fNoClobber ? "" : "; --force overwrites it");
}

int Get(TArguments const& arguments) {
  TTarget const source = TargetOf(arguments.fUrl, false);
  if (source.fIsHost) throw TWrongUsage("a URL is needed, ftp:// or sftp://");
  bool const isThere = IsThere(arguments.fFile);
  std::string const why = WhyNotWritten(arguments);
  if (!why.empty()) {
    std::cerr << "zep: " << why << "\n";
    return kExitNotWritten;
  }
  TTransferred const fetched = GetFile(source.fRemote, arguments.fFile, isThere || arguments.fForce, arguments.fOptions);
  return TellOf(fetched, "zep get", arguments.fAsJson, arguments.fOptions);
}

}  // namespace

TRun AddGetArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TArguments>();
  command.add_option("url", arguments->fUrl, "ftp://[USER@]HOST[:PORT]/PATH or sftp://...")->required();
  command.add_option("file", arguments->fFile, "The file to write")->required();
  CLI::Option* const force = command.add_flag("--force", arguments->fForce, "Overwrite the file without asking");
  command.add_flag("--no-clobber", arguments->fNoClobber, "Leave a file that is there as it is, without asking")->excludes(force);
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  AddTransferOptions(command, arguments->fOptions);
  command.allow_extras();  // HasExtras refuses them
  command.footer(
      "A file that is there is overwritten after a question, which is asked on a terminal only. Until all has arrived the file\n"
      "bears \".part\" behind its name; what arrived of a broken transfer keeps that name.\n" +
      TransferHelp());
  return [&command, arguments] { return HasExtras(command) ? kExitUsage : Get(*arguments); };
}

}  // namespace NQRVZEP20::zep
