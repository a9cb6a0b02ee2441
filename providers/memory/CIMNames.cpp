// SPDX-License-Identifier: Apache-2.0
#include "CIMNames.h"

#include "TZEPException.h"

#include <algorithm>
#include <cstdint>

namespace NQRVZEP20 {

namespace {

char Fold(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

bool IsNameStart(char c) { return c == '_' || (Fold(c) >= 'a' && Fold(c) <= 'z') || static_cast<unsigned char>(c) >= 0x80; }

}  // namespace

bool IsCIMName(std::string const& text) {
  if (text.empty() || !IsNameStart(text.front())) return false;
  return std::all_of(text.begin(), text.end(), [](char c) { return IsNameStart(c) || IsDigit(c); });
}

void RequireCIMName(std::string const& text) {
  if (!IsCIMName(text)) throw TZEPException(kZEPStatusInvalidCIMName);
}

bool IsSameName(std::string_view a, std::string_view b) {
  return a.size() == b.size() &&
         std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) { return x == y || Fold(x) == Fold(y); });
}

std::string FoldName(std::string name) {
  std::transform(name.begin(), name.end(), name.begin(), Fold);
  return name;
}

// FNV-1a over the folded bytes.
std::size_t TNameHash::operator()(std::string const& name) const {
  std::uint64_t hash = 14695981039346656037u;
  for (char const c : name) hash = (hash ^ static_cast<unsigned char>(Fold(c))) * 1099511628211u;
  return hash;
}

}  // namespace NQRVZEP20
