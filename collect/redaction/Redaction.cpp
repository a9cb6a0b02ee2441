// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Redaction.h"

#include "collect/redaction/DocumentTexts.h"
#include "collect/redaction/TSecretCollector.h"
#include "collect/redaction/TSecretIndex.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

using TJson = nlohmann::ordered_json;
using TKinds = std::vector<ESecretKind>;

constexpr char const* kRedaction = "redaction";
constexpr char const* kRedactedCode = "redacted";  // why a number is null; the reason is its pseudonym

// Whether the text belongs to the result of sending, which was added after the redaction.
bool IsOfSending(TJson const& document, std::string const& place) {
  auto const sent = document.find("sent");
  if (sent == document.end() || !sent->is_object()) return false;
  bool const hasFailed = sent->value("bytes", TJson()).is_null();
  return place.rfind("/sent/", 0) == 0 || (hasFailed && place == "/reason");
}

bool IsIn(TKinds const& kinds, ESecretKind kind) { return std::find(kinds.begin(), kinds.end(), kind) != kinds.end(); }

// Adds a member. The library would copy all other members, of any size.
void AddLast(TJson& object, char const* name, TJson value) {
  TJson::object_t members;
  members.reserve(object.size() + 1);
  for (auto& [key, member] : object.get_ref<TJson::object_t&>()) members.emplace(key, std::move(member));
  members.emplace(name, std::move(value));
  object = std::move(members);
}

void Redact(TSecretNumber const& number, TPseudonyms& pseudonyms) {
  TJson& property = *number.fProperty;
  property["reason"] = pseudonyms.For(&number.fSecret, property["value"].dump());
  property["code"] = kRedactedCode;
  property["value"] = nullptr;
}

void UnredactNumber(TJson& property, TPseudonyms const& pseudonyms) {
  std::string const reason = property["reason"].get<std::string>();
  std::string const* const spelling = pseudonyms.SpellingOf(reason);
  TJson const value = spelling == nullptr ? TJson() : TJson::parse(*spelling, nullptr, false);
  if (value.is_null() || value.is_discarded()) throw TRedactionError(reason + " is not a number in the map");
  property["value"] = value;
  property.erase("code");
  property.erase("reason");
}

template <class TUse>
void ForEachRedactedNumber(TJson& document, TUse use) {
  for (TJson& instance : document["instances"])
    for (auto& [name, property] : instance["properties"].get_ref<TJson::object_t&>())
      if (property.value("code", TJson()) == kRedactedCode) use(property);
}

}  // namespace

TSecretCounts CountSecrets(TJson document) {
  TSecretIndex index;
  TSecretCollector(index, {kSecretKinds.begin(), kSecretKinds.end()}).Collect(document);
  return index.Counts();
}

bool IsRedacted(TJson const& document) { return document.contains(kRedaction); }

TRedactedWith RedactedWith(TJson const& document) {
  try {
    TRedactedWith result{{}, document.at(kRedaction).at("map")};
    for (TJson const& name : document.at(kRedaction).at("kinds").get_ref<TJson::array_t const&>())
      if (auto const kind = SecretKindFrom(name.get_ref<std::string const&>())) result.fKinds.push_back(*kind);
    return result;
  } catch (TJson::exception const&) {
    throw TRedactionError("/redaction: has no kinds and no map");
  }
}

void Redact(TJson& document, TKinds const& kinds, TPseudonyms& pseudonyms) {
  TSecretIndex index;
  for (TSecret const& secret : pseudonyms.Secrets())
    if (IsIn(kinds, secret.fKind)) index.Add(secret.fKind, secret.fValue);
  ForEachRedactedNumber(document, [](TJson const&) { throw TRedactionError("a number of it is redacted already"); });
  TSecretCollector collector(index, kinds);
  collector.Collect(document);
  auto const replace = [&](TSecret const* secret, std::string const& spelling) { return pseudonyms.For(secret, spelling); };
  RewriteTexts(document, [&](std::string_view text, TPlace const&) { return index.Rewritten(text, replace); });
  for (TSecretNumber const& number : collector.Numbers()) Redact(number, pseudonyms);
  TJson names = TJson::array();
  for (ESecretKind const kind : kinds) names.push_back(NameOf(kind));
  AddLast(document, kRedaction, {{"kinds", names}, {"map", pseudonyms.Id()}});
}

void Unredact(TJson& document, TPseudonyms const& pseudonyms) {
  if (!IsRedacted(document)) throw TRedactionError("it is not redacted");
  if (RedactedWith(document).fMap != pseudonyms.Id()) throw TRedactionError("it was redacted with another map");
  document.erase(kRedaction);
  ForEachRedactedNumber(document, [&](TJson& property) { UnredactNumber(property, pseudonyms); });
  TSecretIndex const none;
  RewriteTexts(document, [&](std::string_view text, TPlace const& place) {
    return none.Rewritten(text, [&](TSecret const*, std::string const& pseudonym) {
      std::string const* const spelling = pseudonyms.SpellingOf(pseudonym);
      if (spelling == nullptr && IsOfSending(document, place.AsText())) return pseudonym;
      if (spelling == nullptr) throw TRedactionError(place.AsText() + ": " + pseudonym + " is not in the map");
      return *spelling;
    });
  });
}

}  // namespace NQRVZEP20
