// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/TJsonTree.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// A value in a stored document, and its place. Each member that expects a certain kind of value throws TStoredReportError,
// without the name of the file, if the value is not of that kind: "/instances/4/class: is not a string".
//
// Refers to the document and to the node above it, which must outlive the object.
class TStoredNode {
public:
  using EKind = TJsonTree::EKind;

  explicit TStoredNode(TJsonTree const& document) : fDocument(document) {}

  TStoredNode Member(std::string_view name) const;                   // which must exist
  std::optional<TStoredNode> Optional(std::string_view name) const;  // the last of that name; none if it does not exist
  EKind Kind() const { return fDocument.KindOf(fAt); }
  bool IsNull() const { return Kind() == EKind::kNull; }
  bool IsArray() const { return Kind() == EKind::kArray; }
  bool IsObject() const { return Kind() == EKind::kObject; }
  bool IsString() const { return Kind() == EKind::kString; }
  std::string Name() const;  // the key or the number

  std::string Text() const;
  std::string TextOrNull() const;  // null becomes an empty text
  double Number() const;
  std::string TextOf(std::string_view member) const { return Member(member).Text(); }
  std::string TextOrNullOf(std::string_view member) const { return Member(member).TextOrNull(); }

  std::string ScalarText() const { return std::string(fDocument.TextOf(fAt)); }  // the content of a string; else as AsJson
  std::string AsJson() const;                                                    // without spaces

  // Calls `use` with each element of an array, or each member of an object.
  template <class TUse>
  void ForEachElement(TUse use) const {
    if (!IsArray()) Refuse("is not an array");
    ForEach(use);
  }
  template <class TUse>
  void ForEachMember(TUse use) const {
    if (!IsObject()) Refuse("is not an object");
    ForEach(use);
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
  TStoredNode(TStoredNode const& parent, std::size_t at, std::size_t number)
      : fDocument(parent.fDocument), fParent(&parent), fAt(at), fNumber(number) {}

  template <class TUse>
  void ForEach(TUse use) const {
    std::size_t number = 0;
    for (std::size_t at = fAt + 1; at < fDocument.EndOf(fAt); at = fDocument.EndOf(at)) use(TStoredNode(*this, at, number++));
  }

  std::string Place() const { return fParent == nullptr ? "" : fParent->Place() + "/" + Name(); }

  TJsonTree const& fDocument;
  TStoredNode const* fParent = nullptr;
  std::size_t fAt = 0;      // in the document
  std::size_t fNumber = 0;  // among the elements or members of the parent
};

}  // namespace NQRVZEP20
