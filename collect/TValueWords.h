// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

class ICIMPropertyDecl;

// The names of the values of an enumerated property, from its qualifiers ValueMap and Values or those of the property that it
// overrides. An entry of ValueMap is a value, a range ("16..31", "..7", "32767..") or "..", which matches all other values;
// without ValueMap the names are numbered from 0.
//
// A plain value that does not refer to the declaration. Several threads may read the same object.
class TValueWords {
public:
  // Exceptions thrown by the declaration pass through.
  explicit TValueWords(ICIMPropertyDecl const& property);

  // The entries of ValueMap and their names, in the order of the schema; none if the property is not enumerated.
  std::vector<std::pair<std::string, std::string>> const& Entries() const { return fEntries; }

  // The name of one value, which must not be an array; empty if it has none or is NULL.
  std::string WordFor(TCIMValue const& value) const;

  // The value as text, followed by its name: "5 (OK)", or "NULL". An array is printed in braces: "{ 2 (Degraded), 5 (OK) }".
  std::string TextOf(TCIMValue const& value) const;

private:
  std::vector<std::pair<std::string, std::string>> fEntries;
};

}  // namespace NQRVZEP20
