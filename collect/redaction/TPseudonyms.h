// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/redaction/TSecretIndex.h"

#include <nlohmann/json.hpp>

#include <cstddef>
#include <map>
#include <stdexcept>
#include <string>
#include <string_view>
#include <unordered_map>

namespace NQRVZEP20 {

// Why a map of pseudonyms, or a redacted document, is refused, with the place: "/values/3/pseudonym: is not a pseudonym".
struct TRedactionError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

// The length of the pseudonym with which the text begins, such as "serial-12b"; 0 if it begins with none.
std::size_t SizeOfPseudonym(std::string_view text);

// The size of a pseudonym without the letters that name a spelling: 8 of "serial-12b".
std::size_t SizeWithoutLetters(std::string_view pseudonym);

// Whether all of the text is the pseudonym of a secret, not of a text that looks like one.
bool IsPseudonymOfSecret(std::string_view text);

// The map between secrets and their pseudonyms: "serial-1", "host-2", "address-3", "user-4". Another spelling of the same value
// has the same pseudonym with a letter: "address-3b". A text that looks like a pseudonym has one, too: "text-5".
//
// A plain value.
class TPseudonyms {
public:
  using TJson = nlohmann::ordered_json;

  // An empty map. `id` names it in the documents that are redacted with it.
  explicit TPseudonyms(std::string id) : fId(std::move(id)) {}

  // Reads the map from its document. Throws TRedactionError if it is not the complete document of a map.
  static TPseudonyms From(TJson const& document);

  TJson AsJson() const;

  std::string const& Id() const { return fId; }

  // The pseudonym of a spelling, which is added if it is new. `secret`: as in TSecretIndex::TReplace.
  std::string For(TSecret const* secret, std::string const& spelling);

  // The spelling of a pseudonym; null if it is unknown.
  std::string const* SpellingOf(std::string const& pseudonym) const;

  // The secrets with a pseudonym, without their other spellings.
  std::vector<TSecret> Secrets() const;

private:
  void Add(std::string const& pseudonym, std::string const& spelling);
  std::string NewPseudonym(std::string const& prefix) const;
  std::string Variant(std::string const& pseudonym) const;

  std::string fId;
  std::vector<std::string> fOrder;  // the pseudonyms, in the order of their addition
  std::unordered_map<std::string, std::string> fSpellings, fPseudonyms;
  std::map<std::string, std::size_t> fLast;  // the highest number of each prefix
};

}  // namespace NQRVZEP20
