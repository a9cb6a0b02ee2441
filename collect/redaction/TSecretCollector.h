// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/redaction/SecretProperties.h"
#include "collect/redaction/TSecretIndex.h"

#include <nlohmann/json.hpp>

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

// A property whose value is a number, or numbers, and a secret. It cannot become a pseudonym.
struct TSecretNumber {
  nlohmann::ordered_json* fProperty;
  std::string fPlace;  // "/instances/4/properties/SerialNumber"
  std::string fValue;  // as it is in the index
};

// Collects the secrets of these kinds in the document of a report.
class TSecretCollector {
public:
  using TJson = nlohmann::ordered_json;

  // The secrets are added to `index`, which must live longer.
  TSecretCollector(TSecretIndex& index, std::vector<ESecretKind> kinds) : fIndex(index), fKinds(std::move(kinds)) {}

  // Throws TRedactionError if the document does not have the form of a report.
  void Collect(TJson& document);

  // Valid as long as the document keeps its members.
  std::vector<TSecretNumber> const& Numbers() const { return fNumbers; }

private:
  struct TClass {
    std::vector<std::string> fLine;                      // the class and its superclasses
    std::unordered_map<std::string, EMeaning> fSecrets;  // of the properties that the plug-in marked, in lower case
  };

  void ReadClasses(TJson const& classes);
  TClass const& ClassOf(std::string const& name);
  void CollectRows(TJson const& rows);
  std::optional<EMeaning> MeaningOf(TClass const& ofInstance, std::string const& property) const;
  void CollectInstance(TJson& instance, std::size_t at);
  void CollectDescribed(TJson const& properties, TJson const& values);
  void CollectShapes(std::string_view text, bool isMessage);
  void AddAddressesIn(std::string_view text, bool withIPv4);
  void AddProperty(EMeaning meaning, TJson& property, std::string const& place);
  void AddNumber(ESecretKind kind, TJson& property, std::string const& place);
  void AddAll(EMeaning meaning, TJson const& value);
  void AddMeant(EMeaning meaning, std::string const& text);
  void AddHost(std::string const& host);
  void AddDomain(std::string domain);
  void AddUser(std::string const& user);
  void AddPassword(std::string const& password);
  void AddIdOfPool(std::string const& id);
  void Add(ESecretKind kind, std::string const& value);
  bool IsWanted(ESecretKind kind) const;

  TSecretIndex& fIndex;
  std::vector<ESecretKind> fKinds;
  std::vector<TSecretNumber> fNumbers;
  std::unordered_map<std::string, TClass> fClasses;
};

}  // namespace NQRVZEP20
