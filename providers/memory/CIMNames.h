// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// CIM names: what they may be made of, and how they compare. Case counts for nothing in A to Z, other bytes are compared
// as they are.

// A letter or an underscore, then letters, digits and underscores. Every byte from 0x80 up counts as a letter, so that
// UTF-8 passes.
bool IsCIMName(std::string const& text);

// Throws kZEPStatusInvalidCIMName for what is no CIM name.
void RequireCIMName(std::string const& text);

bool IsSameName(std::string_view a, std::string_view b);

// The name in small letters: one text for every spelling.
std::string FoldName(std::string name);

// For unordered containers keyed by name.
struct TNameHash {
  std::size_t operator()(std::string const& name) const;
};
struct TNameEqual {
  bool operator()(std::string const& a, std::string const& b) const { return IsSameName(a, b); }
};

}  // namespace NQRVZEP20
