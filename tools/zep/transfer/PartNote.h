// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

namespace NQRVZEP20::zep {

// The note of a part is a file in the same directory that names the remote file from which the part was downloaded. The note of
// "f.part" is "f.part.from". A file of that name that is not a note, or not a regular file, is never used, changed or removed.

// The text of a note. `url` has no password; `size` is the size of the complete remote file in bytes, or -1 if the server does
// not report it.
std::string NoteFor(std::string const& url, std::int64_t size);

// The text of the part's note; empty if there is no note or it cannot be read.
std::string ReadNote(std::string const& part);

// Writes the note and replaces an earlier one. If this fails, the part has no note.
void WriteNote(std::string const& part, std::string const& note);

// Removes the note, if there is one.
void RemoveNote(std::string const& part);

}  // namespace NQRVZEP20::zep
