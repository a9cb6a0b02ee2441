// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/secrets/TSecret.h"

#include <string>

namespace NQRVZEP20::zep {

// A file or directory on a server. User, password and host are not percent-encoded; the path is.
struct TRemote {
  std::string fScheme;  // "ftp"
  std::string fUser;
  TSecret fPassword;
  std::string fHost, fPort;  // an empty port: the default port of the scheme
  std::string fPath;         // without the "/" after the host; percent-encoded
};

// Parses "[scheme://][user[:password]@]host[:port][/path]"; the default scheme is `schemeOtherwise`. In the path, characters that
// would start an option or a new line, or end the path, are percent-encoded ("%0A"), and existing escapes are kept. Throws
// TWrongUsage.
TRemote RemoteOf(std::string const& text, std::string const& schemeOtherwise);

// Percent-encodes a file name for use in a path: every character that has a meaning there, including "%".
std::string EncodedName(std::string const& name);

// "user:password@host:port", percent-encoded; empty components are omitted.
std::string AuthorityOf(TRemote const& remote);

// "user:password", percent-encoded, in the form that libcurl takes for a proxy.
std::string UserAndPasswordOf(TRemote const& remote);

// The URL including the password: for the library only.
std::string UrlOf(TRemote const& remote);

// The URL for messages and documents: printable, without the password.
std::string ShownUrlOf(TRemote const& remote);

// Fills in a missing user and password from the netrc file: `netrcFile`, or if that is empty, the file that NETRC names, or
// ~/.netrc. If the password is still missing and standard input is a terminal, prompts for it. What is not found stays empty. If
// `netrcFile` cannot be read to its end or is longer than 1 MiB, throws TWrongUsage; for the other files, prints a warning.
void FindPassword(TRemote& remote, std::string const& netrcFile);

}  // namespace NQRVZEP20::zep
