// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Redaction.h"

#include "collect/redaction/DocumentTexts.h"
#include "collect/redaction/SecretProperties.h"
#include "collect/redaction/TSecretIndex.h"
#include "collect/redaction/Texts.h"

#include <algorithm>
#include <optional>
#include <unordered_map>

namespace NQRVZEP20 {

namespace {

using TJson = nlohmann::ordered_json;
using TKinds = std::vector<ESecretKind>;

constexpr char const* kRedaction = "redaction";
constexpr char const* kRedactedCode = "redacted";  // why a number is null; the reason is its pseudonym

// Whether the property contains domains: their first labels are words such as "dev".
bool IsDomain(std::string const& property) {
  return property == "SearchDomains" || property == "DomainName" || property == "DNSSuffixesToRegister";
}

// The name or address in a URL, or in an address with a port, a prefix length or a zone.
std::string HostIn(std::string const& text) {
  std::size_t const scheme = text.find("://");
  std::string host = scheme == text.npos ? text : text.substr(scheme + 3);
  host = host.substr(0, host.find_first_of("/%"));
  if (scheme != text.npos) host = host.substr(host.rfind('@') + 1);
  if (host.rfind('[', 0) == 0) return host.substr(1, host.find(']') - 1);
  bool const hasPort = std::count(host.begin(), host.end(), ':') == 1;
  return hasPort ? host.substr(0, host.find(':')) : host;
}

// Whether the text belongs to the result of sending, which was added after the redaction.
bool IsOfSending(TJson const& document, std::string const& place) {
  auto const sent = document.find("sent");
  if (sent == document.end() || !sent->is_object()) return false;
  bool const hasFailed = sent->value("bytes", TJson()).is_null();
  return place.rfind("/sent/", 0) == 0 || (hasFailed && place == "/reason");
}

bool IsIn(TKinds const& kinds, ESecretKind kind) { return std::find(kinds.begin(), kinds.end(), kind) != kinds.end(); }

// Whether the member of a document is a message of a plug-in, the kernel or zep.
bool IsMessage(std::string_view member) {
  return member == "reason" || member == "error" || member == "lastLogLine" || member == "words" || member == "note";
}

// Adds a member. The library would copy all other members, of any size.
void AddLast(TJson& object, char const* name, TJson value) {
  TJson::object_t members;
  members.reserve(object.size() + 1);
  for (auto& [key, member] : object.get_ref<TJson::object_t&>()) members.emplace(key, std::move(member));
  members.emplace(name, std::move(value));
  object = std::move(members);
}

// A number that is a secret, which cannot become a pseudonym.
struct TNumber {
  TJson* fProperty;
  TSecret fSecret;
};

void Redact(TNumber const& number, TPseudonyms& pseudonyms) {
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

// Collects the secrets of a document.
class TCollector {
public:
  TCollector(TSecretIndex& index, TKinds kinds) : fIndex(index), fKinds(std::move(kinds)) {}

  void Collect(TJson& document) {
    if (auto const classes = document.find("classes"); classes != document.end()) ReadClasses(*classes);
    for (char const* rows : {"identity", "details"}) CollectRows(document[rows]);
    for (TJson& instance : document["instances"]) CollectInstance(instance);
    RewriteTexts(document, [&](std::string_view text, TPlace const& place) {
      CollectShapes(text, IsMessage(place.Name()));
      return std::nullopt;
    });
  }

  // Valid as long as the document keeps its members.
  std::vector<TNumber> const& Numbers() const { return fNumbers; }

private:
  void ReadClasses(TJson const& classes) {
    try {
      for (TJson const& row : classes) fClasses[row.at("class")] = row.at("superclasses").get<std::vector<std::string>>();
    } catch (TJson::exception const&) {
      throw TRedactionError("/classes: is not a list of classes with their superclasses");
    }
  }

  // The class and its superclasses. A document without the member "classes" has only the class.
  std::vector<std::string> const& LineOf(std::string const& name) {
    auto& line = fClasses[name];
    if (line.empty() || line.front() != name) line.insert(line.begin(), name);
    return line;
  }

  void CollectRows(TJson const& rows) {
    for (auto const& [key, row] : rows.get_ref<TJson::object_t const&>())
      if (auto const kind = KindOfRow(key)) AddAll(*kind, row["value"]);
  }

  void CollectInstance(TJson& instance) {
    auto const& classes = LineOf(instance["class"].get_ref<std::string const&>());
    TJson& properties = instance["properties"];
    for (auto& [name, property] : properties.get_ref<TJson::object_t&>()) {
      TJson const& value = property["value"];
      if (IsDomain(name))
        ForEachString(value, [&](std::string const& text) { Add(ESecretKind::kHosts, text); });
      else if (auto const kind = KindOfProperty(classes, name))
        AddProperty(*kind, property);
      if (name == "InstanceID") ForEachString(value, [&](std::string const& text) { AddIdOfPool(text); });
      if (name == "OtherIdentifyingInfo") CollectDescribed(properties, value);
      if (IsFreeText(name)) ForEachString(value, [&](std::string const& text) { CollectShapes(text, true); });
    }
  }

  void AddProperty(ESecretKind kind, TJson& property) {
    TJson const& value = property["value"];
    if (!IsNumber(property)) return AddAll(kind, value);
    std::string const text = value.is_string() ? value.get<std::string>() : value.dump();
    if (value.is_null() || IsPlaceholder(kind, text) || !IsIn(fKinds, kind)) return;
    fIndex.Add(kind, text);
    fNumbers.push_back({&property, {kind, text}});
  }

  // The elements of OtherIdentifyingInfo that IdentifyingDescriptions calls a serial number.
  void CollectDescribed(TJson const& properties, TJson const& values) {
    auto const found = properties.find("IdentifyingDescriptions");
    if (found == properties.end() || !values.is_array()) return;
    TJson const& descriptions = (*found)["value"];
    if (!descriptions.is_array()) return;
    for (std::size_t at = 0; at < std::min(values.size(), descriptions.size()); ++at)
      if (values[at].is_string() && descriptions[at].is_string() &&
          DescribesSerial(descriptions[at].get_ref<std::string const&>()))
        Add(ESecretKind::kSerials, values[at].get<std::string>());
  }

  // The identifier of a volume group of LVM, of 32 characters, which is also a part of those of its volumes.
  void AddIdOfPool(std::string const& id) {
    constexpr std::string_view pool = "ZEP:pool:";
    if (id.rfind(pool, 0) == 0) Add(ESecretKind::kSerials, id.substr(pool.size()));
  }

  void CollectShapes(std::string_view text, bool isMessage) {
    for (std::string const& address : AddressesIn(text, isMessage)) Add(ESecretKind::kAddresses, address);
    if (isMessage)
      for (std::string const& uuid : UuidsIn(text)) Add(ESecretKind::kSerials, uuid);
    for (std::string const& user : HomesIn(text)) Add(ESecretKind::kUsers, user);
  }

  template <class TUse>
  static void ForEachString(TJson const& value, TUse use) {
    if (value.is_string()) use(value.get_ref<std::string const&>());
    if (value.is_array())
      for (TJson const& element : value) ForEachString(element, use);
  }

  void AddAll(ESecretKind kind, TJson const& value) {
    ForEachString(value, [&](std::string const& text) { AddTyped(kind, text); });
  }

  // The name of a host may be its address, and the access information of a service a name.
  void AddTyped(ESecretKind kind, std::string const& value) {
    std::string const text = kind == ESecretKind::kAddresses ? HostIn(value) : value;
    bool const isAddress = IsIPv4(text) || IsIPv6(text) || IsMac(text);
    if (kind == ESecretKind::kHosts && isAddress) return Add(ESecretKind::kAddresses, text);
    Add(kind, text);
    bool const hasDomain = kind == ESecretKind::kHosts && !isAddress && text.find('.') != text.npos;
    if (hasDomain && text.front() != '.') Add(kind, text.substr(0, text.find('.')));
  }

  void Add(ESecretKind kind, std::string const& value) {
    if (IsIn(fKinds, kind)) fIndex.Add(kind, value);
  }

  TSecretIndex& fIndex;
  TKinds fKinds;
  std::vector<TNumber> fNumbers;
  std::unordered_map<std::string, std::vector<std::string>> fClasses;
};

}  // namespace

TSecretCounts CountSecrets(TJson document) {
  TSecretIndex index;
  TCollector(index, {kSecretKinds.begin(), kSecretKinds.end()}).Collect(document);
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
  TCollector collector(index, kinds);
  collector.Collect(document);
  auto const replace = [&](TSecret const* secret, std::string const& spelling) { return pseudonyms.For(secret, spelling); };
  RewriteTexts(document, [&](std::string_view text, TPlace const&) { return index.Rewritten(text, replace); });
  for (TNumber const& number : collector.Numbers()) Redact(number, pseudonyms);
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
