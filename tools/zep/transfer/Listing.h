// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// An entry in the listing of a directory, as most SFTP servers send it: "-rw-r-----    1 u  g  4 Nov 22 04:00 name".
struct TListedEntry {
  char fType = 0;  // '-' for a regular file, 'd' for a directory, 'l' for a symbolic link; 0 when the entry is not listed
  int fMode = -1;  // the permissions, -1 when the entry is not listed
};

// The entry of that name. The name of a link may be followed by " -> " and its target. An entry in another format is not found.
TListedEntry EntryIn(std::string const& listing, std::string const& name);

}  // namespace NQRVZEP20::zep
