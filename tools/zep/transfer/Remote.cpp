// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Remote.h"

#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/secrets/Password.h"
#include "tools/zep/secrets/PrivateFile.h"
#include "tools/zep/transfer/UrlCoding.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <iostream>
#include <string_view>

namespace NQRVZEP20::zep {

namespace {

void CheckHost(std::string const& host) {
  if (host.empty()) throw TWrongUsage("the host is missing");
  bool const isAddress = host.front() == '[' && host.back() == ']';  // an IPv6 address
  for (char const c : host)
    if (!IsUnreserved(c) && !(isAddress && std::string_view("[:]").find(c) != std::string_view::npos))
      throw TWrongUsage("the host contains a character that is not allowed in a host name");
}

void CheckPort(std::string const& port) {
  bool const isNumber = !port.empty() && port.size() <= 5 && port.find_first_not_of("0123456789") == port.npos;
  if (!isNumber || std::stoi(port) < 1 || std::stoi(port) > 65535) throw TWrongUsage("a port is a number from 1 to 65535");
}

void ReadUser(std::string const& text, TRemote& remote) {
  std::size_t const colon = text.find(':');
  remote.fUser = Decoded(text.substr(0, colon));
  if (colon != text.npos) remote.fPassword = SecretOf(Decoded(std::string_view(text).substr(colon + 1)));
}

void ReadAuthority(std::string const& text, TRemote& remote) {
  std::size_t const at = text.rfind('@');
  if (at != text.npos) ReadUser(text.substr(0, at), remote);
  std::string const place = at == text.npos ? text : text.substr(at + 1);
  std::size_t const bracket = place.rfind(']');
  std::size_t const colon = place.find(':', bracket == place.npos ? 0 : bracket);
  remote.fHost = place.substr(0, colon);
  CheckHost(remote.fHost);
  if (colon == place.npos) return;
  remote.fPort = place.substr(colon + 1);
  CheckPort(remote.fPort);
}

// Refuses "u:12/w@h", which is ambiguous: "12/w" may be a password, or 12 a port and "w@h" a path. A password would be sent in
// the path to the host "u".
void CheckForPassword(std::string const& authority, std::string const& path) {
  bool const hasPort = authority.find(':', authority.front() == '[' ? authority.find(']') : 0) != authority.npos;
  bool const hasUser = authority.find('@') != authority.npos;
  if (hasPort && !hasUser && path.find('@') != path.npos)
    throw TWrongUsage(
        "the first \"/\" comes before an \"@\", which is ambiguous: write \"/\" in a password as %2F, or \"@\" in a path as %40");
}

// ---- Passwords ----

std::string DefaultNetrc() {
  if (char const* const named = std::getenv("NETRC")) return named;
  char const* const home = std::getenv("HOME");
  return home ? std::string(home) + "/.netrc" : "";
}

struct TLogin {
  std::string fUser;
  TSecret fPassword;
};

// Splits a text into words, without copying them.
class TWords {
public:
  explicit TWords(std::string_view text) : fRest(text) {}

  // Returns the next word; empty at the end.
  std::string_view Next() {
    constexpr std::string_view kBlanks = " \t\r\n\v\f";
    fRest.remove_prefix(std::min(fRest.find_first_not_of(kBlanks), fRest.size()));
    return Take(std::min(fRest.find_first_of(kBlanks), fRest.size()), 0);
  }
  // Returns the rest of the line.
  std::string_view Line() { return Take(std::min(fRest.find('\n'), fRest.size()), 1); }
  bool IsAtEnd() const { return fRest.empty(); }

private:
  std::string_view Take(std::size_t size, std::size_t behind) {
    std::string_view const taken = fRest.substr(0, size);
    fRest.remove_prefix(std::min(size + behind, fRest.size()));
    return taken;
  }
  std::string_view fRest;
};

// Reads an entry after "machine NAME" or "default". Returns the user, and stores the password in `password` and the keyword that
// begins the next entry in `word`.
std::string ReadLogin(TWords& words, std::string_view& word, std::string_view& password) {
  std::string user;
  password = {};
  while (!(word = words.Next()).empty() && word != "machine" && word != "default") {
    if (word == "login") user = words.Next();
    if (word == "password") password = words.Next();
    if (word == "account") words.Next();
    if (word == "macdef")
      while (!words.IsAtEnd() && !words.Line().empty()) {
      }  // a macro ends at an empty line
  }
  return user;
}

// The first entry for the host, and for the user if one is given.
TLogin LoginIn(std::string_view netrc, TRemote const& remote) {
  TWords words(netrc);
  for (std::string_view word = words.Next(); !word.empty();) {
    bool const isDefault = word == "default", isMachine = word == "machine";
    std::string_view const machine = isMachine ? words.Next() : std::string_view();
    std::string_view password;
    std::string const user = ReadLogin(words, word, password);
    bool const isUser = remote.fUser.empty() || user == remote.fUser;
    bool const isOfHost = isDefault || (isMachine && machine == remote.fHost);
    if (isUser && isOfHost) return {user, TSecret(password)};
  }
  return {};
}

// If the file cannot be read, throws TWrongUsage for the file of --netrc, and prints a warning for another file. A missing
// default file is not reported.
void CheckNetrc(TPrivateFile const& file, std::string const& path, bool isOption) {
  if (file.Error() == 0) return;
  if (isOption) throw TWrongUsage(NameOfPrivateFile(path, "--netrc") + ": " + file.Reason());
  if (file.Error() == ENOENT || file.Error() == ENOTDIR) return;  // as with HOME=/dev/null
  std::cerr << "zep: warning: " << Printable(path) << " cannot be read and is ignored: " << file.Reason() << "\n";
}

// `netrcFile`: the file of --netrc, or empty.
TLogin LoginOf(TRemote const& remote, std::string const& netrcFile) {
  std::string const path = netrcFile.empty() ? DefaultNetrc() : netrcFile;
  TPrivateFile const file(path);
  ThrowIfInterrupted();
  CheckNetrc(file, path, !netrcFile.empty());
  TLogin login = LoginIn(file.Text(), remote);
  if (!login.fPassword.IsEmpty()) file.WarnWhenOthersMayRead();
  return login;
}

}  // namespace

TRemote RemoteOf(std::string const& text, std::string const& schemeOtherwise) {
  TRemote remote;
  std::size_t const colon = text.find("://");
  remote.fScheme = colon == text.npos ? schemeOtherwise : text.substr(0, colon);
  std::string const rest = colon == text.npos ? text : text.substr(colon + 3);
  std::size_t const slash = rest.find('/');
  ReadAuthority(rest.substr(0, slash), remote);
  if (slash == rest.npos) return remote;
  CheckForPassword(rest.substr(0, slash), rest.substr(slash + 1));
  remote.fPath = EncodedPath(rest.substr(slash + 1));
  return remote;
}

std::string EncodedName(std::string const& name) { return Encoded(name, "/!$&'()*+,=:@"); }

std::string UserAndPasswordOf(TRemote const& remote) {
  return Encoded(remote.fUser, "") + (remote.fPassword.IsEmpty() ? "" : ":" + Encoded(remote.fPassword.View(), ""));
}

std::string AuthorityOf(TRemote const& remote) {
  std::string const user = UserAndPasswordOf(remote);
  return (user.empty() ? "" : user + "@") + remote.fHost + (remote.fPort.empty() ? "" : ":" + remote.fPort);
}

std::string UrlOf(TRemote const& remote) { return remote.fScheme + "://" + AuthorityOf(remote) + "/" + remote.fPath; }

std::string ShownUrlOf(TRemote const& remote) {
  TRemote shown = remote;
  shown.fPassword = TSecret();
  return Printable(UrlOf(shown));
}

void FindPassword(TRemote& remote, std::string const& netrcFile) {
  if (!remote.fPassword.IsEmpty()) return;
  TLogin const login = LoginOf(remote, netrcFile);
  if (remote.fUser.empty()) remote.fUser = login.fUser;
  remote.fPassword = login.fPassword;
  if (remote.fPassword.IsEmpty() && !remote.fUser.empty() && ::isatty(STDIN_FILENO))
    remote.fPassword = TypedPassword(remote.fUser + " at " + remote.fHost, "write it to a netrc file");
}

}  // namespace NQRVZEP20::zep
