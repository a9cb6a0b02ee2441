// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <nlohmann/json.hpp>

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A value in a stored document, and its place. Each member that expects a certain kind of value throws TStoredReportError,
// without the name of the file, if the value is not of that kind: "/instances/4/class: is not a string".
//
// Refers to the value and to the node above it, which must outlive the object.
class TStoredNode {
public:
  using TJson = nlohmann::ordered_json;

  explicit TStoredNode(TJson const& root) : fJson(root) {}

  TStoredNode Member(char const* name) const;                   // which must exist
  std::optional<TStoredNode> Optional(char const* name) const;  // none if it does not exist
  bool IsNull() const { return fJson.is_null(); }
  bool IsArray() const { return fJson.is_array(); }
  bool IsString() const { return fJson.is_string(); }
  TJson const& Json() const { return fJson; }
  std::string const& Name() const { return fName; }  // the key or the number

  std::string Text() const;
  std::string TextOrNull() const;  // null becomes an empty text
  double Number() const;
  std::string TextOf(char const* member) const { return Member(member).Text(); }
  std::string TextOrNullOf(char const* member) const { return Member(member).TextOrNull(); }

  // Calls `use` with each element of an array, or each member of an object.
  template <class TUse>
  void ForEachElement(TUse use) const {
    if (!fJson.is_array()) Refuse("is not an array");
    for (std::size_t at = 0; at < fJson.size(); ++at) use(TStoredNode(fJson[at], *this, std::to_string(at)));
  }
  template <class TUse>
  void ForEachMember(TUse use) const {
    if (!fJson.is_object()) Refuse("is not an object");
    for (auto const& [key, value] : fJson.items()) use(TStoredNode(value, *this, key));
  }

  // The elements, each converted by `convert`.
  template <class TConvert>
  auto Elements(TConvert convert) const {
    std::vector<decltype(convert(*this))> elements;
    ForEachElement([&](TStoredNode const& node) { elements.push_back(convert(node)); });
    return elements;
  }

  [[noreturn]] void Refuse(std::string const& why) const;

private:
  TStoredNode(TJson const& json, TStoredNode const& parent, std::string name)
      : fJson(json), fParent(&parent), fName(std::move(name)) {}

  std::string Place() const { return fParent == nullptr ? "" : fParent->Place() + "/" + fName; }

  TJson const& fJson;
  TStoredNode const* fParent = nullptr;
  std::string fName;
};

}  // namespace NQRVZEP20
