// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The syntax and comparison of CIM names. Comparison ignores the case of ASCII letters; other bytes are compared unchanged.

// A name is a letter or an underscore, followed by letters, digits and underscores. All bytes from 0x80 up are treated as
// letters, so that a name may contain UTF-8.
bool IsCIMName(std::string const& text);

// Throws kZEPStatusInvalidCIMName unless the text is a CIM name.
void RequireCIMName(std::string const& text);

bool IsSameName(std::string_view a, std::string_view b);

// The name in lower case, which is the same string for every spelling.
std::string FoldName(std::string name);

// For unordered containers keyed by name.
struct TNameHash {
  std::size_t operator()(std::string const& name) const;
};
struct TNameEqual {
  bool operator()(std::string const& a, std::string const& b) const { return IsSameName(a, b); }
};

}  // namespace NQRVZEP20
