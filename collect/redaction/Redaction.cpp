// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Redaction.h"

#include "collect/redaction/DocumentTexts.h"
#include "collect/redaction/Spellings.h"
#include "collect/redaction/TSecretCollector.h"
#include "collect/redaction/TSecretIndex.h"

#include <algorithm>
#include <optional>
#include <unordered_map>

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

using TLetters = std::vector<std::string>;

// Writes pseudonyms. Spellings of the same value have the same pseudonym; the letters that the map adds to it are kept by place.
class TPseudonymWriter {
public:
  explicit TPseudonymWriter(TPseudonyms& pseudonyms) : fPseudonyms(pseudonyms) {}

  // The text with its secrets replaced, if it has some.
  std::optional<std::string> Write(TSecretIndex const& index, std::string_view text, TPlace const& place) {
    TLetters letters;
    auto rewritten = index.Rewritten(text, [&](TSecret const* secret, std::string const& spelling) {
      bool const isOther = secret != nullptr && spelling != secret->fValue;
      bool const isSame = isOther && CanonicalForm(spelling) == CanonicalForm(secret->fValue);
      return Pseudonym(secret, spelling, isSame, letters);
    });
    bool const isPlain = std::all_of(letters.begin(), letters.end(), [](std::string const& each) { return each.empty(); });
    if (!isPlain) Keep(place.AsText(), letters);
    return rewritten;
  }

  void Write(TSecretIndex const& index, TSecretNumber const& number) {
    TJson& property = *number.fProperty;
    TLetters letters;
    property["reason"] = Pseudonym(&index.SecretOf(number.fValue), property["value"].dump(), true, letters);
    property["code"] = kRedactedCode;
    property["value"] = nullptr;
    Keep(number.fPlace + "/reason", letters);
  }

  // For each text with other spellings: "place", and "letters", an element for each of its pseudonyms.
  TJson const& Spellings() const { return fSpellings; }

private:
  std::string Pseudonym(TSecret const* secret, std::string const& spelling, bool isSame, TLetters& letters) {
    std::string pseudonym = fPseudonyms.For(secret, spelling);
    std::size_t const size = isSame ? SizeWithoutLetters(pseudonym) : pseudonym.size();
    letters.push_back(pseudonym.substr(size));
    pseudonym.resize(size);
    return pseudonym;
  }

  void Keep(std::string const& place, TLetters const& letters) { fSpellings.push_back({{"place", place}, {"letters", letters}}); }

  TPseudonyms& fPseudonyms;
  TJson fSpellings = TJson::array();
};

// Reads the pseudonyms of a redacted document.
class TPseudonymReader {
public:
  TPseudonymReader(TPseudonyms const& pseudonyms, TJson const& document) : fPseudonyms(pseudonyms), fDocument(document) {
    try {
      for (TJson const& each : document.at(kRedaction).value("spellings", TJson::array()))
        fLetters[each.at("place").get<std::string>()] = each.at("letters").get<TLetters>();
    } catch (TJson::exception const&) {
      throw TRedactionError("/redaction/spellings: has no places and no letters");
    }
  }

  // The text with the spellings of its pseudonyms, if it has some.
  std::optional<std::string> Read(std::string_view text, TPlace const& place) const {
    TSecretIndex const none;
    std::size_t at = 0;
    return none.Rewritten(text, [&](TSecret const*, std::string const& pseudonym) {
      std::string const placeText = place.AsText();
      std::string const* const spelling = SpellingOf(pseudonym, placeText, at++);
      if (spelling == nullptr && IsOfSending(fDocument, placeText)) return pseudonym;
      if (spelling == nullptr) throw TRedactionError(placeText + ": " + pseudonym + " is not in the map");
      return *spelling;
    });
  }

  void Read(TJson& property, std::string const& place) const {
    std::string const reason = property["reason"].get<std::string>();
    std::string const* const spelling = SpellingOf(reason, place + "/reason", 0);
    TJson const value = spelling == nullptr ? TJson() : TJson::parse(*spelling, nullptr, false);
    if (value.is_null() || value.is_discarded()) throw TRedactionError(reason + " is not a number in the map");
    property["value"] = value;
    property.erase("code");
    property.erase("reason");
  }

private:
  // The spelling of a pseudonym, of which `at` others are before it in the text.
  std::string const* SpellingOf(std::string const& pseudonym, std::string const& place, std::size_t at) const {
    auto const letters = fLetters.find(place);
    bool const hasLetters = letters != fLetters.end() && at < letters->second.size();
    return fPseudonyms.SpellingOf(hasLetters ? pseudonym + letters->second[at] : pseudonym);
  }

  TPseudonyms const& fPseudonyms;
  TJson const& fDocument;
  std::unordered_map<std::string, TLetters> fLetters;
};

// Whether the property is a number that was replaced. A plug-in may use the same code for another reason.
bool IsRedactedNumber(TJson const& property) {
  if (!IsNumber(property) || property.value("code", TJson()) != kRedactedCode || !property.value("value", TJson(0)).is_null())
    return false;
  TJson const reason = property.value("reason", TJson());
  return reason.is_string() && IsPseudonymOfSecret(reason.get_ref<std::string const&>());
}

template <class TUse>
void ForEachRedactedNumber(TJson& document, TUse use) {
  std::size_t at = 0;
  for (TJson& instance : document["instances"]) {
    std::size_t const number = at++;
    for (auto& [name, property] : instance["properties"].get_ref<TJson::object_t&>())
      if (IsRedactedNumber(property)) use(property, PlaceOfProperty(number, name));
  }
}

ESecretKind KnownKind(std::string const& name) {
  auto const kind = SecretKindFrom(name);
  if (!kind) throw TRedactionError("/redaction/kinds: has another element than serials, hosts, addresses and users");
  return *kind;
}

TJson MemberFor(TKinds const& kinds, std::string const& map, TJson const& spellings) {
  TJson names = TJson::array();
  for (ESecretKind const kind : kinds) names.push_back(NameOf(kind));
  TJson member = {{"kinds", names}, {"map", map}};
  if (!spellings.empty()) member["spellings"] = spellings;
  return member;
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
      result.fKinds.push_back(KnownKind(name.get_ref<std::string const&>()));
    return result;
  } catch (TJson::exception const&) {
    throw TRedactionError("/redaction: has no kinds and no map");
  }
}

void Redact(TJson& document, TKinds const& kinds, TPseudonyms& pseudonyms) {
  TSecretIndex index;
  for (TSecret const& secret : pseudonyms.Secrets())
    if (IsIn(kinds, secret.fKind)) index.Add(secret.fKind, secret.fValue);
  ForEachRedactedNumber(document,
                        [](TJson const&, std::string const&) { throw TRedactionError("a number of it is redacted already"); });
  TSecretCollector collector(index, kinds);
  collector.Collect(document);
  TPseudonymWriter writer(pseudonyms);
  RewriteTexts(document, [&](std::string_view text, TPlace const& place) { return writer.Write(index, text, place); });
  for (TSecretNumber const& number : collector.Numbers()) writer.Write(index, number);
  AddLast(document, kRedaction, MemberFor(kinds, pseudonyms.Id(), writer.Spellings()));
}

void Unredact(TJson& document, TPseudonyms const& pseudonyms) {
  if (!IsRedacted(document)) throw TRedactionError("it is not redacted");
  if (RedactedWith(document).fMap != pseudonyms.Id()) throw TRedactionError("it was redacted with another map");
  TPseudonymReader const reader(pseudonyms, document);
  document.erase(kRedaction);
  ForEachRedactedNumber(document, [&](TJson& property, std::string const& place) { reader.Read(property, place); });
  RewriteTexts(document, [&](std::string_view text, TPlace const& place) { return reader.Read(text, place); });
}

}  // namespace NQRVZEP20
