// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"
#include "tools/zep/transfer/Remote.h"
#include "tools/zep/transfer/TransferState.h"

#include <string>

namespace NQRVZEP20::zep {

// The temporary names that an upload uses, in the directory of its place: for the new file, and for the file that it replaces.
struct TUploadNames {
  std::string fTemporary, fFormer;
};

// Returns random names, which no other transfer uses.
TUploadNames NamesForUpload(TRemote const& place);

// The file with that name in the same directory.
TRemote Beside(TRemote const& place, std::string const& name);

// Call Upload and RemoveParts in a child process (RunWatched), which is killed when a transfer stalls: only the clean-up has a
// time limit of its own. They use FTP or SFTP through libcurl, without a proxy, and throw TZEPFailure with the library's status
// codes.

// Uploads the file under its temporary name and renames it to its place. If the server does not rename onto an existing file, and
// proves that it is a file, that file is renamed first to make way. If there is no such proof, or the server refuses the
// temporary name or the renaming, the file is uploaded directly to its place. A directory is never replaced.
//
// After a failure, removes the incomplete file, for at most `cleanUpSeconds`. At the end, also after a success, state.fLeft
// states what is left on the server.
TZEPStatusCode Upload(TRemote const& place, TUploadNames const& names, std::string const& file, int cleanUpSeconds,
                      TTransferState& state);

// Removes, over a new connection, what an upload left whose process was killed, and clears the bits of fLeft. An earlier file
// that made way gets its name back.
void RemoveParts(TRemote const& place, TUploadNames const& names, int cleanUpSeconds, TTransferState& state);

}  // namespace NQRVZEP20::zep
