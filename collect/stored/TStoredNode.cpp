// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/TStoredNode.h"

#include "collect/SafeText.h"
#include "collect/stored/StoredReport.h"

#include <nlohmann/json.hpp>

#include <charconv>

namespace NQRVZEP20 {

namespace {

using TJson = nlohmann::json;

std::string Quoted(std::string const& text) { return TJson(text).dump(-1, ' ', false, TJson::error_handler_t::replace); }

}  // namespace

TStoredNode TStoredNode::Member(std::string_view name) const {
  auto const member = Optional(name);
  if (!member) Refuse("has no member \"" + std::string(name) + "\"");
  return *member;
}

std::optional<TStoredNode> TStoredNode::Optional(std::string_view name) const {
  std::optional<std::size_t> found;
  if (!IsObject()) Refuse("is not an object");
  for (std::size_t at = fAt + 1; at < fDocument.EndOf(fAt); at = fDocument.EndOf(at))
    if (fDocument.NameOf(at) == name) found = at;
  return found ? std::optional(TStoredNode(*this, *found, 0)) : std::nullopt;
}

std::string TStoredNode::Name() const {
  bool const isElement = fParent != nullptr && fParent->IsArray();
  return isElement ? std::to_string(fNumber) : std::string(fDocument.NameOf(fAt));
}

std::string TStoredNode::Text() const {
  if (!IsString()) Refuse("is not a string");
  return ScalarText();
}

std::string TStoredNode::TextOrNull() const { return IsNull() ? "" : Text(); }

double TStoredNode::Number() const {
  if (Kind() != EKind::kInteger && Kind() != EKind::kFloat) Refuse("is not a number");
  std::string_view const text = fDocument.TextOf(fAt);
  double number = 0;
  std::from_chars(text.data(), text.data() + text.size(), number);
  return number;
}

std::string TStoredNode::AsJson() const {
  if (IsString()) return Quoted(ScalarText());
  if (!IsArray() && !IsObject()) return ScalarText();
  std::string text;
  ForEach([&](TStoredNode const& node) {
    text += (text.empty() ? "" : ",") + (IsObject() ? Quoted(node.Name()) + ":" : "") + node.AsJson();
  });
  return IsArray() ? "[" + text + "]" : "{" + text + "}";
}

void TStoredNode::Refuse(std::string const& why) const {
  constexpr std::size_t longest = 400;
  std::string const place = Place();
  throw TStoredReportError(Shortened(Printable(place), longest) + (place.empty() ? "the document " : ": ") + why);
}

}  // namespace NQRVZEP20
