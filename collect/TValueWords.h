// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

class ICIMPropertyDecl;

// The words for the values of an enumerated property: its qualifiers ValueMap and Values, or those of the property that it
// overrides. An entry of ValueMap is a value, a range ("16..31", "..7", "32767..") or "..", which matches all other values;
// without ValueMap the words are numbered from 0.
//
// A plain value that keeps no reference to the declaration. Several threads may read one.
class TValueWords {
public:
  // Passes on what the declaration throws.
  explicit TValueWords(ICIMPropertyDecl const& property);

  // The entries and their words, in the order of the schema; none when the property is not enumerated.
  std::vector<std::pair<std::string, std::string>> const& Entries() const { return fEntries; }

  // The word for one value, which is not an array; empty when there is none, and for NULL.
  std::string WordFor(TCIMValue const& value) const;

  // The value as text, followed by its word: "5 (OK)"; "NULL". An array has braces: "{ 2 (Degraded), 5 (OK) }".
  std::string TextOf(TCIMValue const& value) const;

private:
  std::vector<std::pair<std::string, std::string>> fEntries;
};

}  // namespace NQRVZEP20
