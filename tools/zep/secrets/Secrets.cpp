// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/secrets/Secrets.h"

#include "tools/zep/output/Text.h"
#include "tools/zep/processes/WriteWhole.h"
#include "tools/zep/secrets/TSecret.h"
#include "tools/zep/transfer/UrlCoding.h"

#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <iostream>
#include <streambuf>
#include <utility>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

constexpr std::string_view kStars = "***";
constexpr std::string_view kPrefix = "zep: ";
constexpr std::string_view kBlanks = " \t\r\n\v\f";
// Characters that end a URL in a text, besides a blank.
constexpr std::string_view kEndsOfUrl = "\"'<>`{}|\\^";

// Each one verbatim and in the forms that libraries and servers use. The longest come first: one may be part of another.
std::vector<TSecretBytes>& AllSecrets() {
  static std::vector<TSecretBytes> secrets;
  return secrets;
}

void Add(std::string_view secret) {
  auto& secrets = AllSecrets();
  TSecretBytes bytes(secret.begin(), secret.end());
  if (bytes.empty() || std::find(secrets.begin(), secrets.end(), bytes) != secrets.end()) return;
  auto const isShorter = [&](TSecretBytes const& other) { return other.size() < bytes.size(); };
  secrets.insert(std::find_if(secrets.begin(), secrets.end(), isShorter), std::move(bytes));
}

// The form of a secret, which is overwritten.
void AddForm(std::string&& form) {
  Add(form);
  Wipe(form.data(), form.size());
}

std::string Base64Of(std::string_view text) {
  constexpr char const* kDigits = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  std::string encoded;
  encoded.reserve((text.size() + 2) / 3 * 4);  // so that no part remains in freed memory
  for (std::size_t at = 0; at < text.size(); at += 3) {
    auto const byte = [&](std::size_t i) { return i < text.size() ? static_cast<unsigned char>(text[i]) : 0u; };
    unsigned const bits = byte(at) << 16 | byte(at + 1) << 8 | byte(at + 2);
    for (int digit = 0; digit < 4; ++digit) encoded += kDigits[bits >> (18 - 6 * digit) & 63];
  }
  std::size_t const padding = (3 - text.size() % 3) % 3;
  return encoded.replace(encoded.size() - padding, padding, padding, '=');
}

bool IsWordAt(std::string const& text, std::size_t at, std::size_t length) {
  auto const isLetter = [&](std::size_t i) { return i < text.size() && std::isalnum(static_cast<unsigned char>(text[i])) != 0; };
  return (at == 0 || !isLetter(at - 1)) && !isLetter(at + length);
}

// Where a password is within a text; of size 0 when there is none.
struct TSpan {
  std::size_t fStart = 0, fSize = 0;
};

// Replaces the spans, which are in order and do not overlap, by stars. One pass: a long text may repeat a password often.
void HideSpans(std::string& text, std::vector<TSpan> const& spans) {
  if (spans.empty()) return;
  std::string hidden;
  std::size_t done = 0;
  for (TSpan const& span : spans) {
    hidden.append(text, done, span.fStart - done).append(kStars);
    done = span.fStart + span.fSize;
  }
  hidden.append(text, done);
  Wipe(text.data(), text.size());
  text = std::move(hidden);
}

void Replace(std::string& text, std::string_view secret) {
  constexpr std::size_t kShort = 4;
  std::vector<TSpan> spans;
  for (std::size_t at = 0; (at = text.find(secret, at)) != text.npos;) {
    bool const isHidden = secret.size() >= kShort || IsWordAt(text, at, secret.size());
    if (isHidden) spans.push_back({at, secret.size()});
    at += isHidden ? secret.size() : 1;
  }
  HideSpans(text, spans);
}

// The colon after the user (or the host), not one in an IPv6 address.
std::size_t ColonOf(std::string_view word) {
  bool const hasBracket = !word.empty() && word.front() == '[';
  return word.find(':', hasBracket ? std::min(word.find(']'), word.size()) : 0);
}

// In "user:secret@host/path". A password that contains "/" is hidden, too, although it cannot be distinguished from a port and a
// path: "u:1/x@h".
TSpan SpanInPlace(std::string_view place) {
  std::string_view const authority = place.substr(0, place.find('/'));
  std::size_t const colon = ColonOf(place);
  bool const isInAuthority = authority.find('@') != authority.npos;
  std::size_t const at = isInAuthority ? authority.rfind('@') : place.rfind('@');
  if (colon == place.npos || at == place.npos || colon > at || colon >= authority.size()) return {};
  return {colon + 1, at - colon - 1};
}

std::size_t StartOfPlace(std::string_view word) {
  std::size_t const scheme = word.find("://");
  return scheme == word.npos ? 0 : scheme + 3;
}

bool IsUserCharacter(char c) {
  return std::isalnum(static_cast<unsigned char>(c)) != 0 || std::string_view("-._~%+\\@").find(c) != std::string_view::npos;
}

// "Host:CIM_Chassis.Tag="a@b"" names an object.
bool IsObjectPath(std::string_view word) { return word.find("=\"") != word.npos; }

// In a word without a scheme, such as `proxy="user:secret@host:8080"`. A mail address has no password.
TSpan SpanInBareWord(std::string_view word) {
  std::size_t const colon = word.find(':');
  if (colon == word.npos || IsObjectPath(word)) return {};
  std::size_t start = colon;
  while (start > 0 && IsUserCharacter(word[start - 1])) --start;
  std::string_view const place = word.substr(start);
  if (start == colon || place.rfind("mailto:", 0) == 0) return {};
  TSpan span = SpanInPlace(place);
  bool const hasHost = span.fSize > 0 && start + span.fStart + span.fSize + 1 < word.size();
  span.fStart += start;
  return hasHost ? span : TSpan();
}

// Hides the passwords of all URLs in the text.
void ReplaceInUrls(std::string& text) {
  std::vector<TSpan> spans;
  for (std::size_t at = 0; (at = text.find("://", at)) != text.npos;) {
    at += 3;
    std::size_t const end = std::min(text.find_first_of(std::string(kBlanks) + std::string(kEndsOfUrl), at), text.size());
    TSpan const span = SpanInPlace(std::string_view(text).substr(at, end - at));
    if (span.fSize == 0) continue;
    spans.push_back({at + span.fStart, span.fSize});
    at = spans.back().fStart + span.fSize;  // a "://" within a password does not start another URL
  }
  HideSpans(text, spans);
}

// Hides the passwords of all words without a scheme.
void ReplaceInBareWords(std::string& text) {
  std::vector<TSpan> spans;
  for (std::size_t at = 0; (at = text.find_first_not_of(kBlanks, at)) != text.npos;) {
    std::size_t const end = std::min(text.find_first_of(kBlanks, at), text.size());
    std::string_view const word = std::string_view(text).substr(at, end - at);
    TSpan const span = word.find("://") == word.npos ? SpanInBareWord(word) : TSpan();
    if (span.fSize > 0) spans.push_back({at + span.fStart, span.fSize});
    at = end;
  }
  HideSpans(text, spans);
}

// The buffer of std::cerr. It holds back a line until it is complete, because a password may be written in parts.
class TErrorBuffer : public std::streambuf {
public:
  ~TErrorBuffer() override { TErrorBuffer::sync(); }

protected:
  int_type overflow(int_type c) override {
    if (c == traits_type::eof()) return traits_type::not_eof(c);
    fLine += static_cast<char>(c);
    if (c == '\n') sync();
    return c;
  }
  std::streamsize xsputn(char const* text, std::streamsize size) override {
    fLine.append(text, static_cast<std::size_t>(size));
    if (fLine.find('\n') != fLine.npos) sync();
    return size;
  }
  int sync() override {
    std::string const line = std::exchange(fLine, "");
    std::size_t const start = line.rfind(kPrefix, 0) == 0 ? kPrefix.size() : 0;  // not a password, even if it is the same word
    WriteWhole(STDERR_FILENO, line.substr(0, start) + MessageWithoutSecrets(line.substr(start)));
    return 0;
  }

private:
  std::string fLine;
};

TErrorBuffer& ErrorBuffer() {
  AllSecrets();  // created first, so that it outlives the buffer, which reads it at the end of the program
  static TErrorBuffer buffer;
  return buffer;
}

}  // namespace

void Hide(std::string_view secret) {
  Add(secret);
  AddForm(Encoded(secret, ""));
  AddForm(Printable(secret));
}

void HideLogin(std::string_view user, std::string_view password) {
  if (password.empty()) return;
  TSecretBytes login(user.begin(), user.end());
  login.push_back(':');
  login.insert(login.end(), password.begin(), password.end());
  AddForm(Base64Of({login.data(), login.size()}));
}

void HideIn(std::string_view word) {
  std::size_t const start = StartOfPlace(word);
  TSpan span = start > 0 ? SpanInPlace(word.substr(start)) : SpanInBareWord(word);
  if (span.fSize == 0) return;
  std::string_view const secret = word.substr(start + span.fStart, span.fSize);
  TSecret const hidden(secret), decoded = SecretOf(Decoded(secret));
  // A password that contains "/" may have been read as a path, whose parts are printed separately.
  std::size_t const slash = secret.rfind('/');
  if (slash != secret.npos) TSecret const piece(secret.substr(slash + 1));
}

std::string WithoutSecrets(std::string text) {
  for (TSecretBytes const& secret : AllSecrets()) Replace(text, {secret.data(), secret.size()});
  ReplaceInUrls(text);
  return text;
}

std::string MessageWithoutSecrets(std::string text) {
  text = WithoutSecrets(std::move(text));
  ReplaceInBareWords(text);
  return text;
}

TGuardedErrors::TGuardedErrors() : fBefore(std::cerr.rdbuf(&ErrorBuffer())) { std::cerr << std::nounitbuf; }

TGuardedErrors::~TGuardedErrors() {
  std::cerr.flush();
  std::cerr.rdbuf(fBefore);
  std::cerr << std::unitbuf;
}

}  // namespace NQRVZEP20::zep
