// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/secrets/TSecret.h"

#include <string>

namespace NQRVZEP20::zep {

// A place on a server. Texts are as people write them; UrlOf encodes them.
struct TRemote {
  std::string fScheme;  // "ftp"
  std::string fUser;
  TSecret fPassword;
  std::string fHost, fPort;  // no port: that of the scheme
  std::string fPath;         // below "/"; encoded already
};

// Reads "scheme://[user[:password]@]host[:port]/path"; without a scheme it has the one given. In the path what could be an
// option, a line of its own or the end of the path is encoded ("%0A"), and what is encoded already stays. Throws
// TWrongUsage.
TRemote RemoteOf(std::string const& text, std::string const& schemeOtherwise);

// A file name as a part of a path: everything that means something there is encoded, "%" as well.
std::string EncodedName(std::string const& name);

// "user:password@host:port", encoded; without what there is none of.
std::string AuthorityOf(TRemote const& remote);

// "user:password", encoded, as a proxy is told.
std::string UserAndPasswordOf(TRemote const& remote);

// The whole URL, password and all: for the library only.
std::string UrlOf(TRemote const& remote);

// The URL for people: without the password, and printable.
std::string ShownUrlOf(TRemote const& remote);

// Fills in the user and the password that are missing: from the netrc file (when empty, the one that NETRC names, else
// ~/.netrc), and the password else by asking for it when standard input is a terminal. What is not found stays empty. Throws
// TWrongUsage when the file named cannot be read to its end, or is longer than 1 MiB; the other files cause a warning then.
void FindPassword(TRemote& remote, std::string const& netrcFile);

}  // namespace NQRVZEP20::zep
