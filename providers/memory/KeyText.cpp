// SPDX-License-Identifier: Apache-2.0
#include "KeyText.h"

#include "CIMNames.h"
#include "ICIMClass.h"
#include "TZEPException.h"

#include <charconv>
#include <map>

namespace NQRVZEP20 {

namespace {

// A NULL char16 or datetime within a value cannot be printed. Its text is empty, which no other char16 or datetime has.
std::string PlainText(TCIMValue const& value) {
  try {
    return value.ToString();
  } catch (TZEPException const&) {
    return "";
  }
}

// With every digit: different values may be equal in the six digits of ToString.
std::string ExactText(double number) {
  char text[32];
  return std::string(text, std::to_chars(text, text + sizeof text, number).ptr);
}

std::string ValueText(TCIMValue const& value) {
  if (value.GetType() == TCIMValue::TCIMType::kCIMTypeReal64) return ExactText(value);
  if (value.GetType() == TCIMValue::TCIMType::kCIMTypeReal32) return ExactText(value.operator float());
  if (!value.IsReference()) return PlainText(value);
  TCIMReference const path = value;
  boost::shared_ptr<ICIMClass> const cls = path.GetClass();
  return (cls ? FoldName(cls->GetName(TCIMContext())) : std::string()) + "." + KeyText(path);
}

}  // namespace

std::string KeyText(TCIMReference const& path) {
  std::map<std::string, std::string> keys;
  path.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& binding) {
    if (!binding.second.IsNull()) keys.emplace(FoldName(binding.first), ValueText(binding.second));
    return true;
  });

  std::string text;  // each value follows its length, so that one value cannot look like two
  for (auto const& [name, value] : keys) text += name + "=" + std::to_string(value.size()) + ":" + value;
  return text;
}

}  // namespace NQRVZEP20
