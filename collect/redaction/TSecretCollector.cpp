// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TSecretCollector.h"

#include "collect/redaction/DocumentTexts.h"
#include "collect/redaction/SettingTexts.h"
#include "collect/redaction/TPseudonyms.h"
#include "collect/redaction/Texts.h"

#include <algorithm>
#include <iterator>

namespace NQRVZEP20 {

namespace {

using TJson = TSecretCollector::TJson;

// Whether the member of a document is a message of a plug-in, the kernel or zep.
bool IsMessage(std::string_view member) {
  constexpr std::string_view messages[] = {"reason", "error", "lastLogLine", "words", "note", "exception", "remedy", "whyEmpty"};
  return std::find(std::begin(messages), std::end(messages), member) != std::end(messages);
}

template <class TUse>
void ForEachString(TJson const& value, TUse use) {
  if (value.is_string()) use(value.get_ref<std::string const&>());
  if (value.is_array())
    for (TJson const& element : value) ForEachString(element, use);
}

// The meaning of a property that a plug-in marked with a kind of secret.
EMeaning MeaningOfKind(std::string const& kind) {
  switch (SecretKindFrom(Lower(kind)).value_or(ESecretKind::kSerials)) {
    case ESecretKind::kHosts:
      return EMeaning::kHost;
    case ESecretKind::kAddresses:
      return EMeaning::kAddress;
    case ESecretKind::kUsers:
      return EMeaning::kUser;
    default:
      return EMeaning::kSerial;
  }
}

// A number as a text; bytes, such as those of a MAC address, as hexadecimal digits.
std::string TextOf(TJson const& property) {
  TJson const& value = property["value"];
  if (value.is_string()) return value.get<std::string>();
  if (!value.is_array() || property["type"] != "uint8[]") return value.dump();
  std::string bytes;
  for (TJson const& byte : value)
    if (byte.is_number_integer()) bytes += static_cast<char>(byte.get<int>());
  return HexOf(bytes);
}

}  // namespace

void TSecretCollector::Collect(TJson& document) {
  if (auto const classes = document.find("classes"); classes != document.end()) ReadClasses(*classes);
  for (char const* rows : {"identity", "details"}) CollectRows(document[rows]);
  std::size_t at = 0;
  for (TJson& instance : document["instances"]) CollectInstance(instance, at++);
  RewriteTexts(document, [&](std::string_view text, TPlace const& place) {
    CollectShapes(text, IsMessage(place.Name()));
    return std::nullopt;
  });
}

void TSecretCollector::ReadClasses(TJson const& classes) {
  try {
    for (TJson const& row : classes) {
      TClass& read = fClasses[row.at("class")];
      read.fLine = row.at("superclasses").get<std::vector<std::string>>();
      TJson const secrets = row.value("secrets", TJson::object());
      for (auto const& [property, kind] : secrets.get_ref<TJson::object_t const&>())
        read.fSecrets.emplace(Lower(property), MeaningOfKind(kind.get_ref<std::string const&>()));
    }
  } catch (TJson::exception const&) {
    throw TRedactionError("/classes: is not a list of classes with their superclasses and secrets");
  }
}

// A document without the member "classes" has only the name of the class.
TSecretCollector::TClass const& TSecretCollector::ClassOf(std::string const& name) {
  TClass& found = fClasses[name];
  if (found.fLine.empty() || found.fLine.front() != name) found.fLine.insert(found.fLine.begin(), name);
  return found;
}

std::optional<EMeaning> TSecretCollector::MeaningOf(TClass const& ofInstance, std::string const& property) const {
  auto const marked = ofInstance.fSecrets.empty() ? ofInstance.fSecrets.end() : ofInstance.fSecrets.find(Lower(property));
  return marked == ofInstance.fSecrets.end() ? MeaningOfProperty(ofInstance.fLine, property) : marked->second;
}

void TSecretCollector::CollectRows(TJson const& rows) {
  for (auto const& [key, row] : rows.get_ref<TJson::object_t const&>())
    if (auto const meaning = MeaningOfRow(key)) AddAll(*meaning, row["value"]);
}

void TSecretCollector::CollectInstance(TJson& instance, std::size_t at) {
  TClass const& ofInstance = ClassOf(instance["class"].get_ref<std::string const&>());
  TJson& properties = instance["properties"];
  for (auto& [name, property] : properties.get_ref<TJson::object_t&>()) {
    TJson const& value = property["value"];
    if (auto const meaning = MeaningOf(ofInstance, name)) AddProperty(*meaning, property, PlaceOfProperty(at, name));
    if (name == "InstanceID") ForEachString(value, [&](std::string const& text) { AddIdOfPool(text); });
    if (name == "Links") ForEachString(value, [&](std::string const& text) { AddAddressesIn(text, true); });
    if (name == "OtherIdentifyingInfo") CollectDescribed(properties, value);
    if (IsFreeText(name)) ForEachString(value, [&](std::string const& text) { CollectShapes(text, true); });
  }
}

// The elements of OtherIdentifyingInfo that IdentifyingDescriptions calls a serial number.
void TSecretCollector::CollectDescribed(TJson const& properties, TJson const& values) {
  auto const found = properties.find("IdentifyingDescriptions");
  if (found == properties.end() || !values.is_array()) return;
  TJson const& descriptions = (*found)["value"];
  if (!descriptions.is_array()) return;
  for (std::size_t at = 0; at < std::min(values.size(), descriptions.size()); ++at)
    if (values[at].is_string() && descriptions[at].is_string() && DescribesSerial(descriptions[at].get_ref<std::string const&>()))
      Add(ESecretKind::kSerials, values[at].get<std::string>());
}

void TSecretCollector::CollectShapes(std::string_view text, bool isMessage) {
  AddAddressesIn(text, isMessage);
  if (isMessage)
    for (std::string const& uuid : UuidsIn(text)) Add(ESecretKind::kSerials, uuid);
  for (std::string const& name : IscsiNamesIn(text)) Add(ESecretKind::kSerials, name);
  for (std::string const& user : HomesIn(text)) Add(ESecretKind::kUsers, user);
}

void TSecretCollector::AddAddressesIn(std::string_view text, bool withIPv4) {
  for (std::string const& address : AddressesIn(text, withIPv4)) Add(ESecretKind::kAddresses, address);
}

void TSecretCollector::AddProperty(EMeaning meaning, TJson& property, std::string const& place) {
  if (IsNumber(property))
    AddNumber(KindOf(meaning), property, place);
  else
    AddAll(meaning, property["value"]);
}

void TSecretCollector::AddNumber(ESecretKind kind, TJson& property, std::string const& place) {
  std::string const text = TextOf(property);
  if (property["value"].is_null() || IsPlaceholder(kind, text) || !IsWanted(kind)) return;
  fIndex.Add(kind, text);
  fNumbers.push_back({&property, place, text});
}

void TSecretCollector::AddAll(EMeaning meaning, TJson const& value) {
  ForEachString(value, [&](std::string const& text) { AddMeant(meaning, text); });
}

void TSecretCollector::AddMeant(EMeaning meaning, std::string const& text) {
  auto const addAll = [&](std::vector<TSetting> const& settings) {
    for (TSetting const& setting : settings) AddMeant(setting.fMeaning, setting.fValue);
  };
  switch (meaning) {
    case EMeaning::kSerial:
      return Add(ESecretKind::kSerials, text);
    case EMeaning::kHost:
      return AddHost(text);
    case EMeaning::kDomain:
      return AddDomain(text);
    case EMeaning::kAddress:
      return Add(ESecretKind::kAddresses, HostIn(text));
    case EMeaning::kUrl:
      if (text.find("://") != text.npos) addAll(SettingsInSource(text));
      return AddHost(HostIn(text));
    case EMeaning::kUser:
      return AddUser(text);
    case EMeaning::kPassword:
      return AddPassword(text);
    case EMeaning::kSource:
      return addAll(SettingsInSource(text));
    case EMeaning::kOptions:
      return addAll(SettingsInOptions(text));
    case EMeaning::kCommandLine:
      return addAll(SettingsInCommandLine(text));
  }
}

// A name with or without its domain, or an address.
void TSecretCollector::AddHost(std::string const& host) {
  if (IsIPv4(host) || IsIPv6(host) || IsMac(host)) return Add(ESecretKind::kAddresses, host);
  Add(ESecretKind::kHosts, host);
  std::size_t const dot = host.find('.');
  if (dot == 0 || dot == host.npos) return;
  Add(ESecretKind::kHosts, host.substr(0, dot));
  std::string const domain = host.substr(dot + 1);
  if (domain.find('.') != domain.npos) AddDomain(domain);  // "local" is a word
}

// The domain and those above it, but not the topmost. The first label of a domain may be a word, such as "dev".
void TSecretCollector::AddDomain(std::string domain) {
  constexpr std::size_t mostLabels = 10;
  Add(ESecretKind::kHosts, domain);
  for (std::size_t label = 0; label < mostLabels; ++label) {
    domain.erase(0, std::min(domain.find('.'), domain.size() - 1) + 1);
    if (domain.find('.') == domain.npos) return;
    Add(ESecretKind::kHosts, domain);
  }
}

// "alice", "alice@example.net", "CORP\alice"
void TSecretCollector::AddUser(std::string const& user) {
  Add(ESecretKind::kUsers, user);
  std::size_t const at = user.find('@'), backslash = user.find('\\');
  if (at != user.npos) {
    Add(ESecretKind::kUsers, user.substr(0, at));
    AddDomain(user.substr(at + 1));
  } else if (backslash != user.npos) {
    AddDomain(user.substr(0, backslash));
    Add(ESecretKind::kUsers, user.substr(backslash + 1));
  }
}

// A password may be a usual word, such as "admin".
void TSecretCollector::AddPassword(std::string const& password) {
  constexpr std::size_t shortest = 3;
  if (IsWanted(ESecretKind::kUsers) && Compact(password).size() >= shortest) fIndex.Add(ESecretKind::kUsers, password);
}

// The identifier of a volume group of LVM, of 32 characters, which is also a part of those of its volumes.
void TSecretCollector::AddIdOfPool(std::string const& id) {
  constexpr std::string_view pool = "ZEP:pool:";
  if (id.rfind(pool, 0) == 0) Add(ESecretKind::kSerials, id.substr(pool.size()));
}

void TSecretCollector::Add(ESecretKind kind, std::string const& value) {
  if (IsWanted(kind) && !IsPlaceholder(kind, value)) fIndex.Add(kind, value);
}

bool TSecretCollector::IsWanted(ESecretKind kind) const { return std::find(fKinds.begin(), fKinds.end(), kind) != fKinds.end(); }

}  // namespace NQRVZEP20
