// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/TElement.h"

#include "TCIMReference.h"

#include <charconv>
#include <utility>

namespace NQRVZEP20 {

namespace {

bool IsArray(TCIMValue const& value) { return (value.GetType() & TCIMValue::TCIMType::kCIMTypeArrayFlag) != 0; }

// The answer with its value converted. `convert` returns none for a value of another form.
template <class T, class TConvert>
TAnswer<T> Converted(TAnswer<TCIMValue> const& answer, TConvert const& convert) {
  if (!answer.IsKnown()) return TAnswer<T>::Unknown(answer.fMissing, answer.fSource);
  std::optional<T> value = convert(*answer.fValue);
  if (value) return TAnswer<T>::Known(std::move(*value), answer.fSource);
  return TAnswer<T>::Unknown({kMissingUnexpected, "not in the expected form: \"" + answer.fValue->ToString() + "\""},
                             answer.fSource);
}

template <class T>
std::optional<T> NumberIn(TCIMValue const& value) {
  if (IsArray(value)) return std::nullopt;
  std::string const text = value.ToString();
  T number{};
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return number;
}

}  // namespace

TElement::TElement(TNamespaceView const& view, boost::shared_ptr<ICIMInstance> instance)
    : fView(&view), fInstance(std::move(instance)) {}

std::string TElement::Label() const {
  for (char const* name : {"ElementName", "DeviceID", "Name", "Tag"}) {
    auto const text = Text(name);
    if (text.IsKnown() && !text.fValue->empty()) return *text.fValue;
  }
  return "";
}

std::string TElement::NameIn(std::string const& property) const {
  auto const text = Text(property);
  return text.IsKnown() ? *text.fValue : Path();
}

TAnswer<std::string> TElement::Text(std::string const& property) const {
  return Converted<std::string>(Value(property), [](TCIMValue const& value) {
    return IsArray(value) ? std::nullopt : std::optional<std::string>(value.ToString());
  });
}

TAnswer<std::uint64_t> TElement::Number(std::string const& property) const {
  return Converted<std::uint64_t>(Value(property), NumberIn<std::uint64_t>);
}

TAnswer<double> TElement::Real(std::string const& property) const { return Converted<double>(Value(property), NumberIn<double>); }

TAnswer<bool> TElement::Flag(std::string const& property) const {
  return Converted<bool>(Value(property), [](TCIMValue const& value) -> std::optional<bool> {
    if (value.GetType() != TCIMValue::TCIMType::kCIMTypeBoolean) return std::nullopt;
    return static_cast<bool>(value);
  });
}

TAnswer<std::vector<std::string>> TElement::Texts(std::string const& property) const {
  using TTexts = std::vector<std::string>;
  return Converted<TTexts>(Value(property), [](TCIMValue const& value) -> std::optional<TTexts> {
    if (!IsArray(value)) return std::nullopt;
    TTexts texts;
    for (TCIMValue const& element : static_cast<std::vector<TCIMValue>&>(value)) texts.push_back(element.ToString());
    return texts;
  });
}

TAnswer<std::string> TElement::KeyOf(std::string const& property, std::string const& key) const {
  return Converted<std::string>(Value(property), [&](TCIMValue const& value) -> std::optional<std::string> {
    if (value.GetType() != TCIMValue::TCIMType::kCIMTypeReference) return std::nullopt;
    std::optional<std::string> found;
    static_cast<TCIMReference>(value).EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& binding) {
      if (binding.first == key) found = binding.second.ToString();
      return !found;
    });
    return found;
  });
}

}  // namespace NQRVZEP20
