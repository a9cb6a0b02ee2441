// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {
class ICIMPropertyDecl;
}

namespace NQRVZEP20::zep {

// What the values of an enumerated property mean: its qualifiers ValueMap and Values, or those of the property that it
// overrides. An entry of ValueMap is a value, a range ("16..31", "..7", "32767..") or "..", which stands for all others;
// without ValueMap the words count from 0.
class TValueWords {
public:
  explicit TValueWords(ICIMPropertyDecl const& property);

  // The entries and their words, in the order of the schema; none when the property is not enumerated.
  std::vector<std::pair<std::string, std::string>> const& Entries() const { return fEntries; }

  // The word for one value, which is no array; empty when there is none.
  std::string WordFor(TCIMValue const& value) const;

  // The value as text, with its word behind: "5 (OK)"; "NULL".
  std::string TextOf(TCIMValue const& value) const;

private:
  std::vector<std::pair<std::string, std::string>> fEntries;
};

}  // namespace NQRVZEP20::zep
