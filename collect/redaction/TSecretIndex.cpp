// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TSecretIndex.h"

#include "collect/redaction/Spellings.h"
#include "collect/redaction/TPseudonyms.h"
#include "collect/redaction/Texts.h"

#include <algorithm>
#include <cstdint>
#include <set>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kPartSize = 6;  // the bytes by which a part of a word is found

// A hash of the text in lower case.
std::uint32_t HashOf(std::string_view text) {
  std::uint32_t hash = 0;
  for (char const byte : text) hash = hash * 31 + static_cast<unsigned char>(Lower(byte));
  return hash;
}

// The hash of kPartSize bytes after `first`, from that of kPartSize bytes with `first`, which lack `next`.
std::uint32_t NextHash(std::uint32_t hash, char first, char next) {
  constexpr std::uint32_t weight = 31 * 31 * 31 * 31 * 31;  // of the first of six bytes
  hash -= weight * static_cast<unsigned char>(Lower(first));
  return hash * 31 + static_cast<unsigned char>(Lower(next));
}

bool HasDigit(std::string_view text) {
  return std::any_of(text.begin(), text.end(), [](char byte) { return byte >= '0' && byte <= '9'; });
}

bool IsLetters(std::string_view text) {
  return std::all_of(text.begin(), text.end(), [](char byte) { return Lower(byte) >= 'a' && Lower(byte) <= 'z'; });
}

std::string Upper(std::string text) {
  for (char& byte : text)
    if (byte >= 'a' && byte <= 'z') byte = static_cast<char>(byte - 'a' + 'A');
  return text;
}

bool IsSame(std::string_view text, std::string_view spelling, bool isExact) {
  if (isExact) return text == spelling;
  return text.size() == spelling.size() &&
         std::equal(text.begin(), text.end(), spelling.begin(), [](char a, char b) { return Lower(a) == b; });
}

}  // namespace

void TSecretIndex::Add(ESecretKind kind, std::string const& value) {
  if (!fValues.insert(value).second) return;
  std::size_t const secret = fSecrets.size();
  fSecrets.push_back({kind, value});
  bool const isExact = IsLetters(value);
  if (isExact)
    for (std::string const& text : std::set<std::string>{value, Upper(value), Lower(value)}) AddSpelling({text, 0, secret, true});
  for (std::string const& text : SpellingsOf(value)) {
    if (isExact && text == Lower(value)) continue;
    AddSpelling({text, 0, secret, false});
    AddPart(text, secret);
  }
}

void TSecretIndex::AddSpelling(TSpelling spelling) {
  std::string const& text = spelling.fText;
  while (spelling.fPrefix < text.size() && SizeOfWordCharacter(text, spelling.fPrefix) == 0) ++spelling.fPrefix;
  std::string const word = Lower(text.substr(spelling.fPrefix, EndOfWord(text, spelling.fPrefix) - spelling.fPrefix));
  if (word.empty()) return;
  fWords.set(HashOf(word) % kHashes);
  auto& known = fSpellings[word];
  auto const isShorter = [&](TSpelling const& other) { return other.fText.size() < text.size(); };
  known.insert(std::find_if(known.begin(), known.end(), isShorter), std::move(spelling));
}

void TSecretIndex::AddPart(std::string const& text, std::size_t secret) {
  if (text.size() < kPartSize || !HasDigit(text) || EndOfWord(text, 0) != text.size()) return;
  fBegins.set(HashOf(text.substr(0, kPartSize)) % kHashes);
  fParts[text.substr(0, kPartSize)].push_back({text, 0, secret, false});
}

TSecretCounts TSecretIndex::Counts() const {
  TSecretCounts counts{};
  for (TSecret const& secret : fSecrets) ++counts[static_cast<std::size_t>(secret.fKind)];
  return counts;
}

std::optional<std::string> TSecretIndex::Rewritten(std::string_view text, TReplace const& replace) const {
  std::string result;
  std::size_t copied = 0;
  for (std::size_t at = 0; at < text.size();) {
    std::size_t const end = EndOfWord(text, at);
    THit const hit = end > at ? HitAt(text, copied, at, end) : THit{};
    at = std::max(end, at + 1);
    if (hit.fEnd == 0) continue;
    result += text.substr(copied, hit.fBegin - copied);
    result += replace(hit.fSecret, std::string(text.substr(hit.fBegin, hit.fEnd - hit.fBegin)));
    at = copied = hit.fEnd;
  }
  if (copied == 0) return std::nullopt;
  return result += text.substr(copied);
}

// The secret at the word from `begin` to `end`; the text up to `from` is replaced already. Without one, the end of the hit is 0.
TSecretIndex::THit TSecretIndex::HitAt(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const {
  if (TSpelling const* const spelling = LongestAt(text, from, begin, end)) {
    std::size_t const first = begin - spelling->fPrefix;
    return {first, first + spelling->fText.size(), &fSecrets[spelling->fSecret]};
  }
  if (TSecret const* const secret = SecretIn(text.substr(begin, end - begin))) return {begin, end, secret};
  std::size_t const size = SizeOfPseudonym(text.substr(begin));
  return {begin, size == 0 ? 0 : begin + size, nullptr};
}

TSecretIndex::TSpelling const* TSecretIndex::LongestAt(std::string_view text, std::size_t from, std::size_t begin,
                                                       std::size_t end) const {
  std::string_view const word = text.substr(begin, end - begin);
  if (fSecrets.empty() || !fWords.test(HashOf(word) % kHashes)) return nullptr;
  auto const found = fSpellings.find(Lower(word));
  if (found == fSpellings.end()) return nullptr;
  for (TSpelling const& spelling : found->second) {
    std::size_t const first = begin - spelling.fPrefix, size = spelling.fText.size();
    bool const isFree = begin - from >= spelling.fPrefix;
    bool const touches = from > 0 && first == from;  // the pseudonyms would join to one word: "user-1user-2"
    if (!isFree || touches || first + size > text.size() || !IsWordBound(text, first, first + size)) continue;
    if (IsSame(text.substr(first, size), spelling.fText, spelling.fIsExact)) return &spelling;
  }
  return nullptr;
}

TSecret const* TSecretIndex::SecretIn(std::string_view word) const {
  if (fParts.empty() || word.size() < kPartSize || !HasDigit(word)) return nullptr;
  std::uint32_t hash = HashOf(word.substr(0, kPartSize));
  for (std::size_t at = 0;; ++at) {
    TSecret const* const secret = fBegins.test(hash % kHashes) ? PartAt(word, at) : nullptr;
    if (secret != nullptr || at + kPartSize == word.size()) return secret;
    hash = NextHash(hash, word[at], word[at + kPartSize]);
  }
}

TSecret const* TSecretIndex::PartAt(std::string_view word, std::size_t at) const {
  auto const found = fParts.find(Lower(word.substr(at, kPartSize)));
  if (found == fParts.end()) return nullptr;
  for (TSpelling const& part : found->second)
    if (IsSame(word.substr(at, part.fText.size()), part.fText, false)) return &fSecrets[part.fSecret];
  return nullptr;
}

}  // namespace NQRVZEP20
