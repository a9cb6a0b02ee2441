// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TPseudonyms.h"

#include "collect/redaction/Texts.h"

#include <algorithm>
#include <charconv>
#include <iterator>

namespace NQRVZEP20 {

namespace {

using TJson = TPseudonyms::TJson;

constexpr char const* kDocument = "zep redaction map";
constexpr int kMapVersion = 1;
constexpr std::size_t kGreatestNumber = 999999999;  // nine digits

constexpr std::string_view kPrefixes[] = {"serial", "host", "address", "user", "text"};  // the first ones as in ESecretKind

std::string PrefixOf(TSecret const* secret) {
  return std::string(secret == nullptr ? kPrefixes[kSecretKinds.size()] : kPrefixes[static_cast<std::size_t>(secret->fKind)]);
}

// The parts of a pseudonym. Without a prefix, the text is not a pseudonym.
struct TParts {
  std::string_view fPrefix;
  std::size_t fNumber = 0;
  std::size_t fSize = 0;  // of all
  bool fHasLetter = false;
};

TParts PartsOf(std::string_view text) {
  constexpr std::size_t mostDigits = 9;
  for (std::string_view const prefix : kPrefixes) {
    if (text.size() <= prefix.size() || text[prefix.size()] != '-' || text.substr(0, prefix.size()) != prefix) continue;
    std::size_t const begin = prefix.size() + 1;
    std::size_t const letter = std::min(text.find_first_not_of("0123456789", begin), text.size());
    std::size_t const end = std::min(text.find_first_not_of("abcdefghijklmnopqrstuvwxyz", letter), text.size());
    if (letter == begin || letter - begin > mostDigits || !IsWordBound(text, 0, end)) return {};
    TParts parts{prefix, 0, end, end > letter};
    std::from_chars(text.data() + begin, text.data() + letter, parts.fNumber);
    return parts;
  }
  return {};
}

std::string TextAt(TJson const& object, char const* name, std::string const& place) {
  auto const found = object.find(name);
  if (found == object.end() || !found->is_string() || found->get_ref<std::string const&>().empty())
    throw TRedactionError(place + "/" + name + ": is not a text");
  return found->get<std::string>();
}

void CheckMap(TJson const& document) {
  if (!document.is_object() || document.value("document", TJson()) != kDocument)
    throw TRedactionError("it is not a redaction map of zep");
  if (document.value("version", TJson()) != kMapVersion)
    throw TRedactionError("/version: is not " + std::to_string(kMapVersion) + ", the version that this zep reads");
  if (!document.contains("values") || !document["values"].is_array()) throw TRedactionError("/values: is not an array");
}

}  // namespace

std::size_t SizeOfPseudonym(std::string_view text) { return PartsOf(text).fSize; }

std::size_t SizeWithoutLetters(std::string_view pseudonym) {
  TParts const parts = PartsOf(pseudonym);
  return parts.fHasLetter ? pseudonym.find_last_of("0123456789") + 1 : parts.fSize;
}

bool IsPseudonymOfSecret(std::string_view text) {
  TParts const parts = PartsOf(text);
  return parts.fSize > 0 && parts.fSize == text.size() && parts.fPrefix != kPrefixes[kSecretKinds.size()];
}

TPseudonyms TPseudonyms::From(TJson const& document) {
  CheckMap(document);
  TPseudonyms pseudonyms(TextAt(document, "map", ""));
  std::size_t at = 0;
  for (TJson const& value : document["values"]) {
    std::string const place = "/values/" + std::to_string(at++);
    if (!value.is_object()) throw TRedactionError(place + ": is not an object");
    std::string const pseudonym = TextAt(value, "pseudonym", place);
    if (SizeOfPseudonym(pseudonym) != pseudonym.size()) throw TRedactionError(place + "/pseudonym: is not a pseudonym");
    if (pseudonyms.fSpellings.count(pseudonym) > 0) throw TRedactionError(place + "/pseudonym: occurs twice");
    pseudonyms.Add(pseudonym, TextAt(value, "value", place));
  }
  return pseudonyms;
}

TJson TPseudonyms::AsJson() const {
  TJson values = TJson::array();
  for (std::string const& pseudonym : fOrder) values.push_back({{"pseudonym", pseudonym}, {"value", fSpellings.at(pseudonym)}});
  return {{"document", kDocument}, {"version", kMapVersion}, {"map", fId}, {"values", std::move(values)}};
}

std::string TPseudonyms::For(TSecret const* secret, std::string const& spelling) {
  if (auto const known = fPseudonyms.find(spelling); known != fPseudonyms.end()) return known->second;
  std::string const& value = secret == nullptr ? spelling : secret->fValue;
  if (fPseudonyms.count(value) == 0) Add(NewPseudonym(PrefixOf(secret)), value);
  if (spelling != value) Add(Variant(fPseudonyms.at(value)), spelling);
  return fPseudonyms.at(spelling);
}

std::string const* TPseudonyms::SpellingOf(std::string const& pseudonym) const {
  auto const found = fSpellings.find(pseudonym);
  return found == fSpellings.end() ? nullptr : &found->second;
}

std::vector<TSecret> TPseudonyms::Secrets() const {
  std::vector<TSecret> secrets;
  for (std::string const& pseudonym : fOrder) {
    TParts const parts = PartsOf(pseudonym);
    auto const kind = static_cast<std::size_t>(std::find(std::begin(kPrefixes), std::end(kPrefixes), parts.fPrefix) - kPrefixes);
    if (kind < kSecretKinds.size() && !parts.fHasLetter) secrets.push_back({kSecretKinds[kind], fSpellings.at(pseudonym)});
  }
  return secrets;
}

void TPseudonyms::Add(std::string const& pseudonym, std::string const& spelling) {
  TParts const parts = PartsOf(pseudonym);
  std::size_t& last = fLast[std::string(parts.fPrefix)];
  last = std::max(last, parts.fNumber);
  fSpellings.emplace(pseudonym, spelling);
  fPseudonyms.emplace(spelling, pseudonym);
  fOrder.push_back(pseudonym);
}

std::string TPseudonyms::NewPseudonym(std::string const& prefix) const {
  auto const last = fLast.find(prefix);
  if (last != fLast.end() && last->second >= kGreatestNumber) throw TRedactionError("its pseudonyms are used up");
  return prefix + "-" + std::to_string(last == fLast.end() ? 1 : last->second + 1);
}

// "serial-1b" for "serial-1", then "serial-1c"; after "serial-1z" comes "serial-1zb".
std::string TPseudonyms::Variant(std::string const& pseudonym) const {
  std::string base = pseudonym;
  for (char letter = 'b';; ++letter) {
    std::string const variant = base + letter;
    if (fSpellings.count(variant) == 0) return variant;
    if (letter == 'z') base += letter, letter = 'a';
  }
}

}  // namespace NQRVZEP20
