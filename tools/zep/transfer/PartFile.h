// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/transfer/TransferState.h"

#include <string>

namespace NQRVZEP20::zep {

// A part is the file into which a download is written until it is complete. The part of "f" is "f.part"; PartNote.h describes its
// note.

// Whether a regular file of that name exists.
bool IsRegularFile(std::string const& file);

// Why the part cannot be written, for the user; empty if it can. The part of an earlier download is not changed.
std::string WhyNoPart(std::string const& part);

// Whether the part is still the file that the download wrote, and has the size that it had at the end.
bool IsAsWritten(std::string const& part, TTransferState const& state);

// The end of a message about a failed download: how many bytes arrived, and the path of the part.
std::string PartText(std::string const& part);

// Renames a complete part to `file`; an existing file is replaced only with `overwrites`. Returns 0, or errno after a failure,
// which leaves the part readable by its owner only.
//
// The part gets the group and the mode of the replaced file, or the mode that the umask allows for a new file. If this process
// may not set the group, the group gets no permissions, and others get none that the former group did not have.
int RenamePart(std::string const& part, std::string const& file, bool overwrites);

}  // namespace NQRVZEP20::zep
