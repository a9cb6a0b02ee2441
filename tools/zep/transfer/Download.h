// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"
#include "tools/zep/transfer/Remote.h"
#include "tools/zep/transfer/TransferState.h"

#include <sys/types.h>

#include <cstdint>
#include <string>

namespace NQRVZEP20::zep {

// Only the owner may read the part of a download, because the file that it will replace may be private.
constexpr mode_t kModeOfPart = 0600;

// Downloads a file by FTP or SFTP into `part`, through libcurl and without a proxy. Blocks without a time limit, so call it in a
// child process (RunWatched). Throws TZEPFailure with the library's status codes.
//
// With `isThere` the part may exist. The download resumes it if its modification time is that of the remote file
// (MarkForResuming), its note (PartNote.h) has the same URL and size, and the server can start in the middle. Otherwise the part
// is replaced when the first bytes arrive, and gets a note. Without `isThere` an existing part fails with
// kZEPStatusAlreadyExists. If the remote file is larger than `mostBytes` (0: no limit), the download fails with
// state.fIsTooLarge set.
TZEPStatusCode Download(TRemote const& remote, std::string const& part, bool isThere, std::uint64_t mostBytes,
                        TTransferState& state);

// Sets the modification time of the part to that of the remote file, so that a later download can resume it. Does nothing if
// the time is not known.
void MarkForResuming(std::string const& part, TTransferState const& state);

}  // namespace NQRVZEP20::zep
