// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"
#include "tools/zep/transfer/Remote.h"
#include "tools/zep/transfer/TransferState.h"

#include <string>

namespace NQRVZEP20::zep {

// The names beside the place that an upload uses.
struct TUploadNames {
  std::string fTemporary, fFormer;
};

// Names that no other transfer has.
TUploadNames NamesForUpload(TRemote const& place);

// The place of that name in the same directory.
TRemote Beside(TRemote const& place, std::string const& name);

// Upload and RemoveParts run in a process of their own (RunWatched). They transfer by FTP or SFTP through libcurl, without a
// proxy, and throw TZEPFailure with the library's status codes. No command has a time limit, except while an upload is cleaned
// up: the watch over the process ends a transfer that stalls.

// Sends the file under the temporary name beside the place, and renames it to the place. If a file is there that the server
// does not rename onto, and the server proves that it is a file, that file makes way first. If the server refuses the temporary
// name or the renaming, or does not prove that, the file is sent to the place itself. A directory is never replaced.
//
// Removes what a failed upload left, for at most `cleanUpSeconds`. At the end, also after a success, state.fLeft has what is
// left.
TZEPStatusCode Upload(TRemote const& place, TUploadNames const& names, std::string const& file, int cleanUpSeconds,
                      TTransferState& state);

// Removes the parts that an upload left whose process was ended, on a connection of its own, and clears their bits of fLeft. An
// earlier file that made way gets its name back.
void RemoveParts(TRemote const& place, TUploadNames const& names, int cleanUpSeconds, TTransferState& state);

}  // namespace NQRVZEP20::zep
