// SPDX-License-Identifier: Apache-2.0
#include "collect/TValueWords.h"

#include "CIMNames.h"
#include "ICIMClass.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"

#include <charconv>
#include <optional>
#include <string_view>

namespace NQRVZEP20 {

namespace {

using TNumber = long double;  // holds every 64-bit integer exactly
using TPropertyDecl = boost::shared_ptr<ICIMPropertyDecl const>;

// The class's own declaration of that property; empty when there is none. GetPropertyDecl would throw for a missing one, which
// takes far longer.
TPropertyDecl OwnDeclaration(ICIMClass const& cls, std::string const& property) {
  TPropertyDecl own;
  cls.EnumeratePropertyDecls(
      [&](boost::shared_ptr<ICIMPropertyDecl> const& declaration) {
        if (IsSameName(declaration->GetName(TCIMContext()), property)) own = declaration;
        return !own;
      },
      TCIMContext());
  return own;
}

// The property, and then those that it overrides, up to the first one that has the qualifier; null when none has it.
boost::shared_ptr<ICIMQualifier> FindQualifier(ICIMPropertyDecl const& property, std::string const& name) {
  auto qualifier = property.GetQualifier(name, TCIMContext());
  auto const owner = boost::dynamic_pointer_cast<ICIMClass>(property.GetOwner(TCIMContext()).lock());
  std::string const propertyName = property.GetName(TCIMContext());
  auto cls = owner ? owner->GetSuperClass(TCIMContext()) : nullptr;
  for (; cls && !qualifier; cls = cls->GetSuperClass(TCIMContext()))
    if (auto const above = OwnDeclaration(*cls, propertyName)) qualifier = above->GetQualifier(name, TCIMContext());
  return qualifier;
}

// The texts of a qualifier that is an array of strings, of the property itself or the nearest one that it overrides.
std::vector<std::string> TextsOf(ICIMPropertyDecl const& property, std::string const& qualifierName) {
  auto const qualifier = FindQualifier(property, qualifierName);
  std::vector<std::string> texts;
  TCIMValue const value = qualifier ? qualifier->GetValue(TCIMContext()) : TCIMValue();
  if (value.IsNull() || !value.IsArray()) return texts;
  for (TCIMValue const& text : static_cast<std::vector<TCIMValue>&>(value)) texts.push_back(text.IsNull() ? "" : text.ToString());
  return texts;
}

// An integer, decimal or 0x...; nothing for any other text.
std::optional<TNumber> NumberIn(std::string_view text) {
  bool const isNegative = !text.empty() && text.front() == '-';
  if (isNegative) text.remove_prefix(1);
  bool const isHexadecimal = text.substr(0, 2) == "0x" || text.substr(0, 2) == "0X";
  if (isHexadecimal) text.remove_prefix(2);
  unsigned long magnitude = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), magnitude, isHexadecimal ? 16 : 10);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return isNegative ? -static_cast<TNumber>(magnitude) : static_cast<TNumber>(magnitude);
}

// Whether the entry is that number or a range that holds it. An end that is left out is open.
bool Holds(std::string_view entry, TNumber number) {
  std::size_t const dots = entry.find("..");
  if (dots == std::string_view::npos) return NumberIn(entry) == number;
  std::string_view const low = entry.substr(0, dots), high = entry.substr(dots + 2);
  if (low.empty() && high.empty()) return false;  // all that no other entry holds
  auto const first = NumberIn(low), last = NumberIn(high);
  if ((!low.empty() && !first) || (!high.empty() && !last)) return false;
  return (!first || *first <= number) && (!last || number <= *last);
}

}  // namespace

TValueWords::TValueWords(ICIMPropertyDecl const& property) {
  std::vector<std::string> const words = TextsOf(property, "Values");
  if (words.empty()) return;
  std::vector<std::string> entries = TextsOf(property, "ValueMap");
  if (entries.empty())
    for (std::size_t number = 0; number < words.size(); ++number) entries.push_back(std::to_string(number));
  for (std::size_t at = 0; at < words.size() && at < entries.size(); ++at) fEntries.emplace_back(entries[at], words[at]);
}

std::string TValueWords::WordFor(TCIMValue const& value) const {
  if (value.IsNull()) return "";
  std::string const text = value.ToString();
  auto const number = NumberIn(text);
  std::string rest;
  for (auto const& [entry, word] : fEntries) {
    if (entry == text || (number && Holds(entry, *number))) return word;
    if (entry == "..") rest = word;
  }
  return rest;
}

std::string TValueWords::TextOf(TCIMValue const& value) const {
  if (value.IsNull()) return "NULL";
  if (fEntries.empty()) return value.ToString();
  if (value.IsArray()) {
    std::string text;
    for (TCIMValue const& element : static_cast<std::vector<TCIMValue>&>(value))
      text += (text.empty() ? "" : ", ") + TextOf(element);
    return "{ " + text + " }";
  }
  std::string const word = WordFor(value);
  return word.empty() ? value.ToString() : value.ToString() + " (" + word + ")";
}

}  // namespace NQRVZEP20
