// SPDX-License-Identifier: Apache-2.0

// zep get: a file from an FTP or SFTP server.

#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/transfer/Transfer.h"

#include <unistd.h>

#include <CLI/CLI.hpp>

#include <filesystem>
#include <iostream>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TGetArguments {
  std::string fUrl, fFile;
  bool fForce = false, fNoClobber = false, fAsJson = false;
  TTransferOptions fOptions;
};

namespace fs = std::filesystem;

// The target of a symbolic link: the target is written, and the link remains.
std::string WithoutLinks(std::string const& file) {
  std::error_code nowhere;
  if (!fs::is_symlink(fs::symlink_status(file, nowhere))) return file;
  fs::path const target = fs::canonical(file, nowhere);
  return nowhere ? file : target.string();
}

bool IsOverwritingWanted(std::string const& file) {
  std::cerr << "zep: " << Printable(file) << " exists; overwrite it? (y/n): " << std::flush;
  std::string answer;
  std::getline(std::cin, answer);
  return answer == "y" || answer == "Y";
}

// Why the file may not be written; empty when it may. Prompts only when standard input is a terminal. A device, a broken link
// and the like are never replaced.
std::string WhyNotWritten(TGetArguments const& arguments, std::string const& file, fs::file_status const& status) {
  if (!fs::exists(status)) return "";
  if (fs::is_directory(status)) return Printable(file) + " is a directory";
  if (!fs::is_regular_file(status)) return Printable(file) + " is not a regular file";
  if (arguments.fForce) return "";
  if (!arguments.fNoClobber && ::isatty(STDIN_FILENO))
    return IsOverwritingWanted(file) ? "" : Printable(file) + " was not overwritten";
  return Printable(file) + " exists" + (arguments.fNoClobber ? "" : "; --force overwrites it");
}

int Refuse(TRemote const& source, std::string const& file, std::string const& why, bool asJson) {
  TTransferred refused;
  refused.fOutcome = {kZEPStatusAlreadyExists, kExitNotWritten, why};
  refused.fUrl = ShownUrlOf(source);
  refused.fFile = file;
  if (asJson) WriteOutput(zep::AsText(DocumentOf(refused, "zep get")));
  std::cerr << "zep: " << why << "\n";
  return kExitNotWritten;
}

int Get(TGetArguments const& arguments) {
  if (IsUrl(arguments.fFile)) throw TWrongUsage("FILE is a URL; the URL comes first, the file second");
  TTarget const source = TargetOf(arguments.fUrl, false);
  if (source.fIsHost) throw TWrongUsage("a URL is needed, ftp:// or sftp://");
  std::string const& path = source.fRemote.fPath;
  if (path.empty() || path.back() == '/') throw TWrongUsage("the URL names a directory; add the name of a file");
  std::string const file = WithoutLinks(arguments.fFile);
  std::error_code unknown;
  fs::file_status const status = fs::symlink_status(file, unknown);
  std::string const why = WhyNotWritten(arguments, file, status);
  if (!why.empty()) return Refuse(source.fRemote, file, why, arguments.fAsJson);
  TInterruptGuard const guard;
  bool const overwrites = fs::exists(status) || arguments.fForce;
  TTransferred const fetched = GetFile(source.fRemote, file, overwrites, arguments.fOptions);
  return TellOf(fetched, "zep get", arguments.fAsJson, arguments.fOptions);
}

}  // namespace

TRun AddGetArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TGetArguments>();
  command.add_option("url", arguments->fUrl, "ftp://[USER@]HOST[:PORT]/PATH or sftp://...")->required();
  command.add_option("file", arguments->fFile, "The file to write")->required();
  CLI::Option* const force = command.add_flag("--force", arguments->fForce, "Overwrite an existing file without confirmation");
  command.add_flag("--no-clobber", arguments->fNoClobber, "Never overwrite an existing file")->excludes(force);
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  AddSizeOption(command, "--max-size", arguments->fOptions.fMostBytes,
                "The size limit for the file, such as 500K, 2M or 1G (default 10G); 0: no limit");
  AddTransferOptions(command, arguments->fOptions);
  command.footer(
      "An existing file is overwritten only after confirmation, which requires a terminal. A symbolic link remains, and\n"
      "its target is overwritten. Until the download is complete, the file name ends in \".part\". A failed transfer leaves\n"
      "that file and a note of its URL and size, \".part.from\". The next transfer from the same URL resumes the download when\n"
      "the server supports this (FTP: MDTM and REST) and reports the same time and size; otherwise it starts again.\n" +
      TransferHelp());
  return [arguments] { return Get(*arguments); };
}

}  // namespace NQRVZEP20::zep
