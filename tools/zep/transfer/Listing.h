// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// An entry of a directory listing in the format of most SFTP servers: "-rw-r-----    1 u  g  4 Nov 22 04:00 name".
struct TListedEntry {
  char fType = 0;  // '-' for a regular file, 'd' for a directory, 'l' for a symbolic link; 0 if the entry is not listed
  int fMode = -1;  // the permission bits; -1 if the entry is not listed
};

// Returns the entry with that name. In the listing, the name of a symbolic link may be followed by " -> " and its target. Lines
// in another format are ignored.
TListedEntry EntryIn(std::string const& listing, std::string const& name);

}  // namespace NQRVZEP20::zep
