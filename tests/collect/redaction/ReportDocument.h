// SPDX-License-Identifier: Apache-2.0
#pragma once

// Documents of reports that are to be redacted.

#include "collect/redaction/Redaction.h"
#include "collect/stored/StoredDocument.h"
#include "tests/collect/stored/StoredDocument.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

using TJson = nlohmann::ordered_json;

inline std::vector<ESecretKind> AllKinds() { return {kSecretKinds.begin(), kSecretKinds.end()}; }

inline TJson PropertyOf(std::string const& type, TJson const& value) {
  return {{"type", type}, {"value", value}, {"source", "test"}};
}

inline TJson InstanceOf(std::string const& className, TJson const& properties) {
  return {{"path", "root/x:" + className + ".Tag=\"1\""},
          {"provider", "X"},
          {"namespace", "root/x"},
          {"class", className},
          {"properties", properties}};
}

// A document with one instance more.
inline TJson DocumentWith(TJson const& instance) {
  TJson document = TJson::parse(StoredDocument());
  document["instances"].push_back(instance);
  return document;
}

inline TJson DocumentWith(std::string const& property, TJson const& value) {
  return DocumentWith(InstanceOf("X_Thing", {{property, PropertyOf(value.is_array() ? "string[]" : "string", value)}}));
}

inline std::string Redacted(TJson document, std::vector<ESecretKind> const& kinds = AllKinds()) {
  TPseudonyms pseudonyms("1");
  Redact(document, kinds, pseudonyms);
  return document.dump();
}

}  // namespace NQRVZEP20
