#pragma once

#include "CIMNames.h"

#include <boost/shared_ptr.hpp>

#include <cstddef>
#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

// Calls back with each element, in order, until a call returns false; false when one did. An element that leaves the list
// during the walk is not touched again, and one that comes is visited too.
template <class TElement, class TCallback>
bool VisitEach(std::vector<boost::shared_ptr<TElement>> const& elements, TCallback const& callback) {
  for (std::size_t i = 0; i < elements.size(); ++i) {
    const boost::shared_ptr<TElement> element = elements[i];
    if (!callback(element)) return false;
  }
  return true;
}

// Elements in the order in which they were added, which are found by name in constant time.
template <class TElement>
class TNamedList {
public:
  static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

  // The list has no element of that name yet.
  void Add(std::string const& name, boost::shared_ptr<TElement> element) {
    fPositions.emplace(name, fElements.size());
    fElements.push_back(std::move(element));
  }

  // Takes the place of the element of that name, which is there, or else goes to the end.
  void Put(std::string const& name, boost::shared_ptr<TElement> element) {
    const std::size_t position = PositionOf(name);
    if (position == kNone) return Add(name, std::move(element));
    fElements[position] = std::move(element);
  }

  bool Has(std::string const& name) const { return PositionOf(name) != kNone; }

  std::size_t PositionOf(std::string const& name) const {
    const auto found = fPositions.find(name);
    return found == fPositions.end() ? kNone : found->second;
  }

  // Empty when there is none of that name.
  boost::shared_ptr<TElement> Find(std::string const& name) const {
    const std::size_t position = PositionOf(name);
    return position == kNone ? boost::shared_ptr<TElement>() : fElements[position];
  }

  std::vector<boost::shared_ptr<TElement>> const& Elements() const { return fElements; }

  void Clear() {
    fPositions.clear();
    fElements.clear();
  }

private:
  std::vector<boost::shared_ptr<TElement>> fElements;
  std::unordered_map<std::string, std::size_t, TNameHash, TNameEqual> fPositions;  // into fElements
};

}  // namespace NQRVZEP20
