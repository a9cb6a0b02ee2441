// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"
#include "tools/zep/transfer/Remote.h"
#include "tools/zep/transfer/TransferState.h"

#include <sys/types.h>

#include <cstdint>
#include <string>

namespace NQRVZEP20::zep {

// Only its owner may read the part of a download: the file that it will replace may be private.
constexpr mode_t kModeOfPart = 0600;

// Fetches by FTP or SFTP into `part`, in a process of its own (RunWatched), through libcurl and without a proxy. Throws
// TZEPFailure with the library's status codes.
//
// With `isThere` the part may exist. It is continued when it has the time of the remote file (MarkForResuming), its note
// (PartNote.h) has the URL and the size, and the server can start in the middle. Otherwise it is replaced when the first bytes
// arrive, and gets a note. Without `isThere` an existing file is kZEPStatusAlreadyExists. Ends with fIsTooLarge when the remote
// file is larger than `mostBytes` (0: any size).
TZEPStatusCode Download(TRemote const& remote, std::string const& part, bool isThere, std::uint64_t mostBytes,
                        TTransferState& state);

// Gives the part of a download that may be continued later the time of the remote file.
void MarkForResuming(std::string const& part, TTransferState const& state);

}  // namespace NQRVZEP20::zep
