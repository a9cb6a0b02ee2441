// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

namespace NQRVZEP20::zep {

// The note beside the part of a download names the remote file that the part is the beginning of. The note of "f.part" is
// "f.part.from". A file of that name which is not a note, or is not a regular file, is never read, changed or removed.

// The text of a note. `url` has no password; `size` is that of the whole remote file in bytes, -1 when the server does not
// report it.
std::string NoteFor(std::string const& url, std::int64_t size);

// The text of the part's note; empty when the part has none, or it cannot be read.
std::string ReadNote(std::string const& part);

// Writes the note, in place of an earlier one. When that fails the part has no note.
void WriteNote(std::string const& part, std::string const& note);

// Removes the note, if there is one.
void RemoveNote(std::string const& part);

}  // namespace NQRVZEP20::zep
