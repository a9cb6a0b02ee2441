// SPDX-License-Identifier: Apache-2.0
#include "TMemoryType.h"

#include "CIMTypes.h"

#include <charconv>
#include <optional>
#include <string_view>

namespace NQRVZEP20 {

namespace {

// The bound in "[16]", 0 for "[]"; nothing when the text is neither.
std::optional<unsigned int> ParseBrackets(std::string_view text) {
  if (text.size() < 2 || text.front() != '[' || text.back() != ']') return std::nullopt;
  std::string_view const digits = text.substr(1, text.size() - 2);
  if (digits.empty()) return 0u;

  unsigned int bound = 0;
  auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), bound);
  if (error != std::errc() || end != digits.data() + digits.size() || bound == 0) return std::nullopt;
  return bound;
}

}  // namespace

TMemoryType::TMemoryType(char const* text) : fType(TCIMValue::TCIMType::kCIMTypeInvalid) {
  std::string_view const type(text);
  std::size_t const bracket = type.find('[');
  TCIMValue::TCIMType const base(std::string(type.substr(0, bracket)));
  if (base == TCIMValue::TCIMType::kCIMTypeInvalid || bracket == type.npos) {
    fType = base;
    return;
  }
  if (std::optional<unsigned int> const bound = ParseBrackets(type.substr(bracket))) {
    fType = ArrayOf(base);
    fMaxArraySize = *bound;
  }
}

}  // namespace NQRVZEP20
