// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <boost/shared_ptr.hpp>

#include <vector>

namespace NQRVZEP20 {

// An enumeration callback that appends each element to `elements` and never stops the enumeration. `elements` must outlive
// it.
//
//   std::vector<boost::shared_ptr<ICIMInstance>> instances;
//   cls->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), TCIMContext());
template <class X>
class TAddToVectorCallback {
public:
  TAddToVectorCallback(std::vector<boost::shared_ptr<X>>& elements) : fElements(elements) {}

  bool operator()(boost::shared_ptr<X> element) {
    fElements.push_back(element);
    return true;
  }

private:
  std::vector<boost::shared_ptr<X>>& fElements;
};

}  // namespace NQRVZEP20
