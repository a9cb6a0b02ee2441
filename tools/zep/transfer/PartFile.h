// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/transfer/TransferState.h"

#include <string>

namespace NQRVZEP20::zep {

// The file that a download is written to until it is complete. The part of "f" is "f.part"; PartNote.h describes its note.

// Whether a regular file of that name exists.
bool IsRegularFile(std::string const& file);

// Why the part cannot be written, for the user; empty when it can. The part of an earlier download stays as it is.
std::string WhyNoPart(std::string const& part);

// Whether the part is still the file that the download wrote, with everything that arrived.
bool IsAsWritten(std::string const& part, TTransferState const& state);

// The end of a message about a failed download: how much has arrived, and where it is.
std::string PartText(std::string const& part);

// Gives a complete part the name of the file, which it replaces only with `overwrites`. Returns 0 or errno. After a failure only
// the owner may read the part, as before.
//
// The part gets the group and the mode of the replaced file, or the mode that the umask allows to a new file. When this process
// may not set the group, the group gets no permissions.
int RenamePart(std::string const& part, std::string const& file, bool overwrites);

}  // namespace NQRVZEP20::zep
