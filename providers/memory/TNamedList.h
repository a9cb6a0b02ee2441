// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "CIMNames.h"

#include <boost/shared_ptr.hpp>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// Calls back with each element, in order, until a call returns false; returns false when one did. An element that is removed
// during the call is not visited; one that is added is visited.
template <class TElement, class TCallback>
bool VisitEach(std::vector<boost::shared_ptr<TElement>> const& elements, TCallback const& callback) {
  for (std::size_t i = 0; i < elements.size(); ++i) {
    // NOLINTNEXTLINE(performance-unnecessary-copy-initialization): the callback may remove the element
    boost::shared_ptr<TElement> const element = elements[i];
    if (!callback(element)) return false;
  }
  return true;
}

// Elements in the order in which they were added, found by name in constant time. Name() of an element is its name. Most lists
// are short, and there are very many of them, so a list with few elements has no index, and no list copies the names.
template <class TElement>
class TNamedList {
public:
  static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

  TNamedList() = default;
  TNamedList(TNamedList const& other)
      : fElements(other.fElements), fIndex(other.fIndex ? std::make_unique<TIndex>(*other.fIndex) : nullptr) {}
  TNamedList& operator=(TNamedList const&) = delete;

  // The list must not contain an element of that name.
  void Add(boost::shared_ptr<TElement> element) {
    fElements.push_back(std::move(element));
    if (fElements.size() <= kMostWithoutIndex) return;
    if (!fIndex || 2 * fElements.size() > fIndex->size())
      MakeIndex();
    else
      Enter(fElements.size() - 1);
  }

  // Replaces the element of that name, or adds it at the end.
  void Put(boost::shared_ptr<TElement> element) {
    std::size_t const position = PositionOf(element->Name());
    if (position == kNone) return Add(std::move(element));
    fElements[position] = std::move(element);
  }

  bool Has(std::string const& name) const { return PositionOf(name) != kNone; }

  std::size_t PositionOf(std::string const& name) const {
    if (fIndex) {
      std::uint32_t const entry = (*fIndex)[SlotOf(name)];
      return entry == 0 ? kNone : entry - 1;
    }
    for (std::size_t i = 0; i < fElements.size(); ++i)
      if (IsSameName(fElements[i]->Name(), name)) return i;
    return kNone;
  }

  // Empty when the list has no element of that name.
  boost::shared_ptr<TElement> Find(std::string const& name) const {
    std::size_t const position = PositionOf(name);
    return position == kNone ? boost::shared_ptr<TElement>() : fElements[position];
  }

  std::vector<boost::shared_ptr<TElement>> const& Elements() const { return fElements; }

  void Clear() {
    fIndex.reset();
    fElements.clear();
  }

private:
  using TIndex = std::vector<std::uint32_t>;  // a hash table: positions plus 1, and 0 for a free slot; its size is a power of 2

  static constexpr std::size_t kMostWithoutIndex = 8;

  // The slot of the element of that name, or the free slot for it.
  std::size_t SlotOf(std::string const& name) const {
    TIndex const& index = *fIndex;
    std::size_t const mask = index.size() - 1;
    std::size_t slot = TNameHash()(name) & mask;
    while (index[slot] != 0 && !IsSameName(fElements[index[slot] - 1]->Name(), name)) slot = (slot + 1) & mask;
    return slot;
  }

  void Enter(std::size_t position) { (*fIndex)[SlotOf(fElements[position]->Name())] = static_cast<std::uint32_t>(position + 1); }

  // Rebuilds the index, large enough for the list to double.
  void MakeIndex() {
    std::size_t size = 4 * kMostWithoutIndex;
    while (size < 3 * fElements.size()) size *= 2;
    fIndex = std::make_unique<TIndex>(size, 0);
    for (std::size_t i = 0; i < fElements.size(); ++i) Enter(i);
  }

  std::vector<boost::shared_ptr<TElement>> fElements;
  std::unique_ptr<TIndex> fIndex;  // null while the list is short
};

}  // namespace NQRVZEP20
