// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// Writes a file that appears under its name only when it is complete and on the disk: the text goes to a temporary file in the
// same directory, which is then renamed. A regular file of that name is replaced and keeps its permissions. A directory, a
// symbolic link or a device is not replaced. If the file cannot be written, throws TFailure with kExitNotWritten; the temporary
// file is removed. Signals that end zep take effect when the file is complete or removed.
void WriteOutputFile(std::string const& file, std::string const& text);

// The same with a file that only its owner can read and write, also if it replaces another.
void WritePrivateFile(std::string const& file, std::string const& text);

}  // namespace NQRVZEP20::zep
