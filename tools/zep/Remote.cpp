#include "Remote.h"

#include "Failure.h"
#include "Password.h"
#include "Text.h"

#include <unistd.h>

#include <cctype>
#include <cerrno>
#include <cstdlib>
#include <fstream>
#include <string_view>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

bool IsUnreserved(char c) {
  return std::isalnum(static_cast<unsigned char>(c)) || std::string_view("-._~").find(c) != std::string_view::npos;
}

bool IsHexDigit(char c) { return std::isxdigit(static_cast<unsigned char>(c)) != 0; }

// Every character but the unreserved ones and those of `others` as "%2F".
std::string Encoded(std::string_view text, std::string_view others) {
  constexpr char const* kDigits = "0123456789ABCDEF";
  std::string encoded;
  for (char const c : text) {
    if (IsUnreserved(c) || others.find(c) != others.npos) {
      encoded += c;
      continue;
    }
    auto const byte = static_cast<unsigned char>(c);
    (encoded += '%') += kDigits[byte >> 4];
    encoded += kDigits[byte & 15];
  }
  return encoded;
}

bool IsEscape(std::string_view text, std::size_t at) {
  return text[at] == '%' && at + 2 < text.size() && IsHexDigit(text[at + 1]) && IsHexDigit(text[at + 2]);
}

// The same, but "%2F" in the text stays as it is.
std::string EncodedPath(std::string_view text) {
  std::string encoded;
  for (std::size_t i = 0; i < text.size(); ++i) {
    bool const isEscape = IsEscape(text, i);
    encoded += isEscape ? text.substr(i, 3) : Encoded(text.substr(i, 1), "/!$&'()*+,=:@");
    if (isEscape) i += 2;
  }
  return encoded;
}

std::string Decoded(std::string_view text) {
  std::string decoded;
  for (std::size_t i = 0; i < text.size(); ++i) {
    bool const isEscape = IsEscape(text, i);
    decoded += isEscape ? static_cast<char>(std::stoi(std::string(text.substr(i + 1, 2)), nullptr, 16)) : text[i];
    if (isEscape) i += 2;
  }
  return decoded;
}

void CheckHost(std::string const& host) {
  if (host.empty()) throw TWrongUsage("no host is named");
  bool const isAddress = host.front() == '[' && host.back() == ']';  // of IPv6
  for (char const c : host)
    if (!IsUnreserved(c) && !(isAddress && std::string_view("[:]").find(c) != std::string_view::npos))
      throw TWrongUsage("the host has a character that no host name has");
}

void CheckPort(std::string const& port) {
  bool const isNumber = !port.empty() && port.size() <= 5 && port.find_first_not_of("0123456789") == port.npos;
  if (!isNumber || std::stoi(port) < 1 || std::stoi(port) > 65535) throw TWrongUsage("a port is a number from 1 to 65535");
}

void ReadUser(std::string const& text, TRemote& remote) {
  std::size_t const colon = text.find(':');
  remote.fUser = Decoded(text.substr(0, colon));
  if (colon != text.npos) remote.fPassword = Decoded(text.substr(colon + 1));
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

// "u:12/w@h" has a user and a password with a "/" in it, or else the port 12 and a path with an "@": the one would be told to a
// host "u".
void CheckForPassword(std::string const& authority, std::string const& path) {
  bool const hasPort = authority.find(':', authority.front() == '[' ? authority.find(']') : 0) != authority.npos;
  bool const hasUser = authority.find('@') != authority.npos;
  if (hasPort && !hasUser && path.find('@') != path.npos)
    throw TWrongUsage("is that a password? A \"/\" in one is written %2F, an \"@\" in a path %40");
}

// ---- Passwords ----

std::string DefaultNetrc() {
  if (char const* const named = std::getenv("NETRC")) return named;
  char const* const home = std::getenv("HOME");
  return home ? std::string(home) + "/.netrc" : "";
}

struct TLogin {
  std::string fUser, fPassword;
};

// Reads the words behind "machine NAME" or "default", up to the next of these, which is left in `word`.
TLogin ReadLogin(std::istream& file, std::string& word) {
  TLogin login;
  std::string macro;
  while (file >> word && word != "machine" && word != "default") {
    if (word == "login") file >> login.fUser;
    if (word == "password") file >> login.fPassword;
    if (word == "account") file >> macro;
    if (word == "macdef")
      while (std::getline(file, macro) && !macro.empty()) {
      }  // a macro ends at an empty line
  }
  return login;
}

// The first entry of the file for the host (and the user, when there is one) counts.
TLogin LoginOf(TRemote const& remote, std::string const& netrcFile) {
  std::ifstream file(netrcFile);
  std::string word, machine;
  file >> word;
  while (file) {
    bool const isDefault = word == "default";
    if (word == "machine") file >> machine;
    bool const isEntry = isDefault || word == "machine";
    TLogin const login = ReadLogin(file, word);
    bool const isUser = remote.fUser.empty() || login.fUser == remote.fUser;
    if (isEntry && isUser && (isDefault || machine == remote.fHost)) return login;
  }
  return {};
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
  return Encoded(remote.fUser, "") + (remote.fPassword.empty() ? "" : ":" + Encoded(remote.fPassword, ""));
}

std::string AuthorityOf(TRemote const& remote) {
  std::string const user = UserAndPasswordOf(remote);
  return (user.empty() ? "" : user + "@") + remote.fHost + (remote.fPort.empty() ? "" : ":" + remote.fPort);
}

std::string UrlOf(TRemote const& remote) { return remote.fScheme + "://" + AuthorityOf(remote) + "/" + remote.fPath; }

std::string ShownUrlOf(TRemote const& remote) {
  TRemote shown = remote;
  shown.fPassword.clear();
  return Printable(UrlOf(shown));
}

void FindPassword(TRemote& remote, std::string const& netrcFile) {
  if (!remote.fPassword.empty()) return;
  if (!netrcFile.empty() && ::access(netrcFile.c_str(), R_OK) != 0)
    throw TWrongUsage(netrcFile + ": " + std::generic_category().message(errno));
  TLogin const login = LoginOf(remote, netrcFile.empty() ? DefaultNetrc() : netrcFile);
  if (remote.fUser.empty()) remote.fUser = login.fUser;
  remote.fPassword = login.fPassword;
  if (remote.fPassword.empty() && !remote.fUser.empty() && ::isatty(STDIN_FILENO))
    remote.fPassword = TypedPassword(remote.fUser + " at " + remote.fHost, "write it to a netrc file");
}

}  // namespace NQRVZEP20::zep
