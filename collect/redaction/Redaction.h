// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/redaction/ESecretKind.h"
#include "collect/redaction/TPseudonyms.h"

#include <nlohmann/json.hpp>

#include <vector>

namespace NQRVZEP20 {

// Secrets in the document of a report, which is a complete one of this library (StoredDocument.h).
//
// A secret is the value of a property that SecretProperties.h lists, a MAC or IPv6 address anywhere, an IPv4 address in free
// text, or the name of a home directory. It is then looked for in every text of the document (TSecretIndex.h), except in names
// that zep and the classes define: titles, codes, types, classes, namespaces.

// The number of different secrets of each kind in a document that is not redacted.
TSecretCounts CountSecrets(nlohmann::ordered_json document);

bool IsRedacted(nlohmann::ordered_json const& document);

// The kinds of secrets that were replaced in a redacted document, and the id of the map. Throws TRedactionError if the document
// does not have them.
struct TRedactedWith {
  std::vector<ESecretKind> fKinds;
  std::string fMap;
};
TRedactedWith RedactedWith(nlohmann::ordered_json const& document);

// Replaces the secrets of these kinds by pseudonyms, and adds the member "redaction": the kinds and the id of the map. Also
// replaces the secrets that the map has from other documents. The document must not be redacted.
void Redact(nlohmann::ordered_json& document, std::vector<ESecretKind> const& kinds, TPseudonyms& pseudonyms);

// Gives the original document back. The result of sending is added after a redaction, so what looks like a pseudonym there, and
// is not in the map, stays. Throws TRedactionError if the document is not redacted, or with another map, or has a pseudonym that
// the map does not have; the document is then unusable.
void Unredact(nlohmann::ordered_json& document, TPseudonyms const& pseudonyms);

}  // namespace NQRVZEP20
