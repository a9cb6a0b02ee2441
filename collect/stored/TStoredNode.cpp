// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/TStoredNode.h"

#include "collect/SafeText.h"
#include "collect/stored/StoredReport.h"

namespace NQRVZEP20 {

TStoredNode TStoredNode::Member(char const* name) const {
  auto const member = Optional(name);
  if (!member) Refuse(std::string("has no member \"") + name + "\"");
  return *member;
}

std::optional<TStoredNode> TStoredNode::Optional(char const* name) const {
  if (!fJson.is_object()) Refuse("is not an object");
  auto const found = fJson.find(name);
  if (found == fJson.end()) return std::nullopt;
  return TStoredNode(*found, *this, name);
}

std::string TStoredNode::Text() const {
  if (!fJson.is_string()) Refuse("is not a string");
  return fJson.get<std::string>();
}

std::string TStoredNode::TextOrNull() const { return fJson.is_null() ? "" : Text(); }

double TStoredNode::Number() const {
  if (!fJson.is_number()) Refuse("is not a number");
  return fJson.get<double>();
}

void TStoredNode::Refuse(std::string const& why) const {
  constexpr std::size_t longest = 400;
  std::string const place = Place();
  throw TStoredReportError(Shortened(Printable(place), longest) + (place.empty() ? "the document " : ": ") + why);
}

}  // namespace NQRVZEP20
