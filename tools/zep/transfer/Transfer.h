// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/transfer/Remote.h"
#include "tools/zep/transfer/Watched.h"

#include <cstdint>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

constexpr std::uint64_t kUsualMostBytes = std::uint64_t{10} << 30;

// What every command that transfers files can be told.
struct TTransferOptions {
  bool fQuiet = false;  // no progress, and no message after a success
  int fStallSeconds = kUsualStallSeconds;
  std::string fNetrc;
  std::uint64_t fMostBytes = kUsualMostBytes;  // of a file that is fetched; 0: any size
  int fCleanUpSeconds = 0;                     // for removing what a failed upload left on the server; 0: the usual time
};

void AddTransferOptions(CLI::App& command, TTransferOptions& options);

// The same, and those of commands that send.
void AddUploadOptions(CLI::App& command, TTransferOptions& options);

// An option that takes a number of bytes, or one of KiB, MiB, GiB or TiB with "K", "M", "G" or "T" behind it.
void AddSizeOption(CLI::App& command, std::string const& name, std::uint64_t& bytes, std::string const& description);

// The end of the help of such a command: passwords, and the exit status for each kind of failure.
std::string TransferHelp();

// A transfer that has ended.
struct TTransferred {
  TOutcome fOutcome;
  std::string fUrl;  // for people
  std::string fFile;
  std::uint64_t fBytes = 0;
  std::string fSha256;                     // of the local file; when all went well
  bool fHasArrived = false;                // of an upload that failed: its complete file is on the server
  std::vector<std::string> fLeftOnServer;  // URLs for people: what an upload may have left there beside the file
  std::string fFormerUrl;                  // the one of these that is the earlier file; empty when there is none
};

// Warns on standard error of what an upload that went well left on the server.
void WarnOfLeft(TTransferred const& transferred);

// Where a file is to be sent: a URL (which ends in "/" when the name is still to be added), or a host alone.
struct TTarget {
  TRemote fRemote;
  bool fIsHost;  // the library chooses the directory then
};

bool IsUrl(std::string const& text);

// Of ftp and sftp only. Throws TWrongUsage.
TTarget TargetOf(std::string const& text, bool bySftp);

// Sends a file under that name ("": its own): under a temporary one at first, which it loses when all has arrived. A file that
// changes meanwhile is sent in part.
TTransferred SendFile(std::string const& file, TTarget target, std::string const& name, TTransferOptions const& options);

// Fetches what the URL names into the file, by way of the file with ".part" behind its name, which stays when the transfer
// breaks off, and with which the next one goes on; one transfer at a time has it. `overwrites`: whether a file may be there.
TTransferred GetFile(TRemote remote, std::string const& file, bool overwrites, TTransferOptions const& options);

// What became of a transfer, as a document of that command.
TJson DocumentOf(TTransferred const& transferred, std::string const& command);

// Says on standard output, or as one JSON document, what became of a transfer, and on standard error why it failed. Returns
// its exit status.
int TellOf(TTransferred const& transferred, std::string const& command, bool asJson, TTransferOptions const& options);

}  // namespace NQRVZEP20::zep
