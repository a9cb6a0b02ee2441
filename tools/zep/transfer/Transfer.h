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

// The options of every command that transfers files.
struct TTransferOptions {
  bool fQuiet = false;  // suppresses the progress, and the message after a success
  int fStallSeconds = kUsualStallSeconds;
  std::string fNetrc;
  std::uint64_t fMostBytes = kUsualMostBytes;  // the size limit for a download; 0: no limit
  int fCleanUpSeconds = 0;                     // the time limit for removing an incomplete upload; 0: the default
};

void AddTransferOptions(CLI::App& command, TTransferOptions& options);

// Adds these and the options of commands that upload.
void AddUploadOptions(CLI::App& command, TTransferOptions& options);

// Adds an option for a size in bytes, or in KiB, MiB, GiB or TiB with the suffix "K", "M", "G" or "T".
void AddSizeOption(CLI::App& command, std::string const& name, std::uint64_t& bytes, std::string const& description);

// The end of the help text of these commands: passwords, and the exit statuses.
std::string TransferHelp();

// The result of a transfer.
struct TTransferred {
  TOutcome fOutcome;
  std::string fUrl;  // for messages: without the password
  std::string fFile;
  std::uint64_t fBytes = 0;
  std::string fSha256;                     // of the local file, after a success
  bool fHasArrived = false;                // of an upload that failed: its complete file is on the server
  std::vector<std::string> fLeftOnServer;  // the URLs of files that an upload may have left on the server
  std::string fFormerUrl;                  // the one that is the replaced file; empty if there is none
};

// Warns on standard error of each file that a successful upload left on the server.
void WarnOfLeft(TTransferred const& transferred);

// The target of an upload: a URL, or a host alone. The name of the file is added to a URL that ends in "/".
struct TTarget {
  TRemote fRemote;
  bool fIsHost;  // a host alone: the library chooses the directory
};

bool IsUrl(std::string const& text);

// Parses a target. Throws TWrongUsage, also for a scheme other than ftp and sftp.
TTarget TargetOf(std::string const& text, bool bySftp);

// Uploads a file under `name`, or under its own name if that is empty. Until the upload is complete, the file has a temporary
// name on the server. If the file changes during the upload, the exit status is kExitPartial.
TTransferred SendFile(std::string const& file, TTarget target, std::string const& name, TTransferOptions const& options);

// Downloads a remote file. Until the download is complete, its bytes are in the part (PartFile.h), which is locked; a failed
// download leaves it, and the next download resumes it. `overwrites`: whether an existing file is replaced.
TTransferred GetFile(TRemote remote, std::string const& file, bool overwrites, TTransferOptions const& options);

// The result as a JSON document of that command.
TJson DocumentOf(TTransferred const& transferred, std::string const& command);

// Prints the result to standard output, as text or as a JSON document, and the reason for a failure to standard error. Returns
// the exit status.
int TellOf(TTransferred const& transferred, std::string const& command, bool asJson, TTransferOptions const& options);

}  // namespace NQRVZEP20::zep
