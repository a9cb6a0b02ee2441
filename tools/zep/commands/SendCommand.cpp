// SPDX-License-Identifier: Apache-2.0

// zep send: a file to an FTP or SFTP server.

#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/transfer/Transfer.h"

#include <CLI/CLI.hpp>

#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TSendArguments {
  std::string fFile, fTarget, fName;
  bool fBySftp = false, fAsJson = false;
  TTransferOptions fOptions;
};

int Send(TSendArguments const& arguments) {
  if (IsUrl(arguments.fFile)) throw TWrongUsage("FILE is a URL; the file comes first, the target second");
  TTarget const target = TargetOf(arguments.fTarget, arguments.fBySftp);
  std::string const& path = target.fRemote.fPath;
  bool const isNamed = !path.empty() && path.back() != '/';
  if (isNamed && !arguments.fName.empty())
    throw TWrongUsage("the URL already contains the file name; --as needs a host or a URL that ends in \"/\"");
  TInterruptGuard const guard;
  TTransferred const sent = SendFile(arguments.fFile, target, arguments.fName, arguments.fOptions);
  return TellOf(sent, "zep send", arguments.fAsJson, arguments.fOptions);
}

}  // namespace

TRun AddSendArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TSendArguments>();
  command.add_option("file", arguments->fFile, "The file to send")->required();
  command.add_option("target", arguments->fTarget, "ftp://[USER@]HOST[:PORT]/PATH, sftp://..., or [USER@]HOST[:PORT] alone")
      ->required();
  command.add_option("--as", arguments->fName,
                     "The name of the file on the server, for a host or a URL that ends in \"/\"; default: the file's own name");
  command.add_flag("--sftp", arguments->fBySftp, "Use SFTP instead of FTP for a target without ftp:// or sftp://");
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  AddUploadOptions(command, arguments->fOptions);
  command.footer(
      "Missing directories are created on the server. The file is sent under a temporary name, which ends in a number and\n"
      "\".part\", and is renamed when the upload is complete. This replaces a file or link of that name, but never a directory.\n"
      "The server chooses the mode of the new file. Exception: if an SFTP server lists the mode of the existing file and\n"
      "refuses to rename onto it, as OpenSSH does, the new file gets that mode. If the server refuses to rename, the file is\n"
      "sent directly under its final name. When only a host is given, the file goes to the directory of the user or, when\n"
      "ZEP_ISBOOTABLE is \"yes\", to hostline/toqrv/vantor/fdr_upload.\n" +
      TransferHelp() +
      "\nAlso 2 when the file was sent, but it changed during the upload or its checksum could not be computed.");
  return [arguments] { return Send(*arguments); };
}

}  // namespace NQRVZEP20::zep
