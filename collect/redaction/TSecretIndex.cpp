// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TSecretIndex.h"

#include "collect/redaction/Spellings.h"
#include "collect/redaction/TNormalText.h"
#include "collect/redaction/TPseudonyms.h"
#include "collect/redaction/Texts.h"

#include <algorithm>
#include <cstdint>
#include <functional>
#include <iterator>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kMostWords = 200;  // the characters of a normal form by which it is found
constexpr std::size_t kPartSize = 6,
                      kMostPart = 64;  // the bytes of a part of a word by which it is found, the least and the most

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

// The number of bytes at the begin of both.
std::size_t SizeOfSame(std::string_view a, std::string_view b) {
  return static_cast<std::size_t>(std::mismatch(a.begin(), a.end(), b.begin(), b.end()).first - a.begin());
}

std::size_t FirstWord(std::string_view text) {
  std::size_t at = 0;
  while (at < text.size() && SizeOfWordCharacter(text, at) == 0) ++at;
  return at;
}

std::size_t EndOfLastWord(std::string_view text) {
  std::size_t last = 0;
  for (std::size_t at = 0; at < text.size();) {
    std::size_t const end = EndOfWord(text, at);
    if (end > at) last = end;
    at = std::max(end, at + 1);
  }
  return last;
}

}  // namespace

void TSecretIndex::Add(ESecretKind kind, std::string const& value) {
  if (!fValues.insert(value).second) return;
  auto const [known, isNew] = fKnown.emplace(CanonicalForm(value), fSecrets.size());
  std::size_t const secret = known->second;
  if (isNew) fSecrets.push_back({kind, value});
  if (isNew) AddSpelling(value, {secret, true, IsLetters(value)});
  if (!isNew) AddCase(value);
  for (std::string const& text : SpellingsOf(value)) {
    AddSpelling(text, {secret, false, false});
    if (EndOfWord(text, 0) == text.size() && HasDigit(text)) AddPart(text, {secret, false});
  }
  for (std::string const& text : Base64Of(value)) AddBase64(text, secret);
}

// A word of letters that is known in several cases is found in all.
void TSecretIndex::AddCase(std::string const& value) {
  auto const known = fSpellings.find(NormalWords(value));
  if (known != fSpellings.end() && !IsAsWritten(known->second, value)) known->second.fIsExact = false;
}

// The value of a secret takes the place of another spelling.
void TSecretIndex::AddSpelling(std::string const& text, TSpelling const& spelling) {
  std::string const normal = NormalWords(text);
  if (normal.empty() || (!spelling.fIsValue && fSpellings.count(normal) > 0)) return;
  std::string const head = FirstWordsOf(normal, kMostWords);
  if (head.size() == normal.size())
    fSpellings[normal] = spelling;
  else
    fLong[head].emplace(normal, spelling.fSecret);
  std::string const word = normal.substr(0, EndOfWord(normal, 0));
  fWords.set(HashOf(word) % kHashes);
  auto& sizes = fSizes[word];
  auto const place = std::lower_bound(sizes.begin(), sizes.end(), head.size(), std::greater<>());
  if (place == sizes.end() || *place != head.size()) sizes.insert(place, head.size());
}

// The marks '+' and '/' separate words of base64.
void TSecretIndex::AddBase64(std::string const& text, std::size_t secret) {
  for (std::size_t begin = 0; begin < text.size();) {
    std::size_t const end = EndOfWord(text, begin);
    AddPart(std::string_view(text).substr(begin, end - begin), {secret, true});
    begin = end + 1;
  }
}

void TSecretIndex::AddPart(std::string_view text, TPart const& part) {
  if (text.size() < kPartSize) return;
  fBegins.set(HashOf(text.substr(0, kPartSize)) % kHashes);
  fParts.emplace(Lower(text.substr(0, kMostPart)), part);
}

TSecret const& TSecretIndex::SecretOf(std::string const& value) const { return fSecrets[fKnown.at(CanonicalForm(value))]; }

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
    THit const hit = end > at ? HitAtWord(text, copied, at, end) : THit{};
    at = std::max(end, at + 1);
    if (hit.fEnd == 0) continue;
    result += text.substr(copied, hit.fBegin - copied);
    result += replace(hit.fSecret, std::string(text.substr(hit.fBegin, hit.fEnd - hit.fBegin)));
    at = copied = hit.fEnd;
  }
  if (copied == 0) return std::nullopt;
  return result += text.substr(copied);
}

// The hit at the begin of the word, or after an escape with which the word begins: "zx81" in "%20zx81".
TSecretIndex::THit TSecretIndex::HitAtWord(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const {
  if (THit const hit = HitAt(text, from, begin, end); hit.fEnd > 0) return hit;
  std::size_t const escape = SizeOfEscapeAt(text, begin);
  return escape > 0 && begin + escape < end ? HitAt(text, begin + escape, begin + escape, end) : THit{};
}

// The secret at the word from `begin` to `end`; the text up to `from` is replaced already. Without one, the end of the hit is 0.
TSecretIndex::THit TSecretIndex::HitAt(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const {
  if (THit const hit = LongestAt(text, from, begin, end); hit.fEnd > 0) return hit;
  if (THit const hit = WordWith(text, from, begin, end); hit.fEnd > 0) return hit;
  std::size_t const size = SizeOfPseudonym(text.substr(begin));
  return {begin, size == 0 ? 0 : begin + size, nullptr};
}

TSecretIndex::THit TSecretIndex::LongestAt(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const {
  std::string_view const word = text.substr(begin, end - begin);
  if (fSecrets.empty() || !fWords.test(HashOf(word) % kHashes)) return {};
  auto const sizes = fSizes.find(Lower(word));
  if (sizes == fSizes.end()) return {};
  TNormalText const normal(text.substr(begin), sizes->second.front());
  for (std::size_t const size : sizes->second) {
    if (!normal.HasWordEnd(size)) continue;
    std::string const head(normal.Text().substr(0, size));
    if (THit const hit = LongHitAt(text, begin, head); hit.fEnd > 0) return hit;
    auto const found = fSpellings.find(head);
    THit const hit{begin, begin + normal.EndOf(size), found == fSpellings.end() ? nullptr : &fSecrets[found->second.fSecret]};
    if (hit.fSecret == nullptr || !IsAsWritten(found->second, text.substr(begin, hit.fEnd - begin))) continue;
    return found->second.fIsValue ? WithSigns(hit, text, from) : hit;
  }
  return {};
}

// The words that are the same as those of a spelling that begins with `head`. At each step, twice as many characters are
// compared: the time is in proportion to the size of the hit.
TSecretIndex::THit TSecretIndex::LongHitAt(std::string_view text, std::size_t begin, std::string const& head) const {
  auto const found = fLong.find(head);
  if (found == fLong.end()) return {};
  TLongSpellings const& spellings = found->second;
  for (std::size_t most = 2 * head.size();; most *= 2) {
    TNormalText const normal(text.substr(begin), most);
    auto const next = spellings.upper_bound(normal.Text());
    auto const last = next == spellings.begin() ? next : std::prev(next);
    std::size_t const sameAsLast = SizeOfSame(normal.Text(), last->first);
    std::size_t const sameAsNext = next == spellings.end() ? 0 : SizeOfSame(normal.Text(), next->first);
    std::size_t const same = std::max(sameAsLast, sameAsNext);
    if (same > most) continue;
    std::size_t const size = normal.LastWordEnd(same);
    auto const exact = spellings.find(normal.Text().substr(0, size));
    auto const nearest = sameAsLast == same ? last : next;
    return {begin, begin + normal.EndOf(size), &fSecrets[exact == spellings.end() ? nearest->second : exact->second]};
  }
}

// Whether the text, which has the normal form of the spelling, is one: in the cases of a word of letters, and without a space
// that may separate two words of a language.
bool TSecretIndex::IsAsWritten(TSpelling const& spelling, std::string_view text) const {
  std::string const& value = fSecrets[spelling.fSecret].fValue;
  if (!spelling.fIsValue) return true;
  if (spelling.fIsExact) return text == value || text == Upper(value) || text == Lower(value);
  return text.find(' ') == text.npos || value.find(' ') != value.npos || HasDigit(value);
}

// With the marks before and after the value: "(bob)". Pseudonyms would otherwise join to one word: "user-1user-2".
TSecretIndex::THit TSecretIndex::WithSigns(THit const& hit, std::string_view text, std::size_t from) const {
  std::string_view const value = hit.fSecret->fValue;
  std::size_t const before = FirstWord(value), after = value.size() - EndOfLastWord(value);
  if (hit.fBegin - from < before || hit.fEnd + after > text.size()) return hit;
  std::size_t const begin = hit.fBegin - before, end = hit.fEnd + after;
  bool const touches = from > 0 && begin == from;
  bool const isSame =
      text.substr(begin, before) == value.substr(0, before) && text.substr(hit.fEnd, after) == value.substr(value.size() - after);
  return isSame && !touches && IsWordBound(text, begin, end) ? THit{begin, end, hit.fSecret} : hit;
}

// The word, if it contains a secret. One in base64 is a spelling together with its other words.
TSecretIndex::THit TSecretIndex::WordWith(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const {
  TPart const* const part = PartIn(text.substr(begin, end - begin));
  if (part == nullptr) return {};
  if (part->fIsBase64) {
    auto const isInner = [&](std::size_t at) { return at < text.size() && (text[at] == '+' || text[at] == '/'); };
    while (begin > from + 1 && (IsLetterOrDigit(text[begin - 1]) || isInner(begin - 1))) --begin;
    while (end < text.size() && (IsLetterOrDigit(text[end]) || isInner(end))) ++end;
  }
  return {begin, end, &fSecrets[part->fSecret]};
}

TSecretIndex::TPart const* TSecretIndex::PartIn(std::string_view word) const {
  if (fParts.empty() || word.size() < kPartSize) return nullptr;
  std::uint32_t hash = HashOf(word.substr(0, kPartSize));
  for (std::size_t at = 0;; ++at) {
    TPart const* const part = fBegins.test(hash % kHashes) ? PartAt(word, at) : nullptr;
    if (part != nullptr || at + kPartSize == word.size()) return part;
    hash = NextHash(hash, word[at], word[at + kPartSize]);
  }
}

// The longest part at that place. Each part with which the word begins, also precedes it in order, and begins a part between
// them.
TSecretIndex::TPart const* TSecretIndex::PartAt(std::string_view word, std::size_t at) const {
  for (std::string begin = Lower(word.substr(at, kMostPart)); begin.size() >= kPartSize;) {
    auto const next = fParts.upper_bound(begin);
    if (next == fParts.begin()) return nullptr;
    auto const& [text, part] = *std::prev(next);
    begin.resize(SizeOfSame(begin, text));
    if (begin.size() == text.size()) return &part;
  }
  return nullptr;
}

}  // namespace NQRVZEP20
