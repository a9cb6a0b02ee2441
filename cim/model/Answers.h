// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPFailure.h"

#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

// Returns `answer`, a pointer that the destination of a copy returned. When it is empty, throws kZEPStatusNotFound with the
// reason "the destination returned no <kind> <name>".
template <class T>
boost::shared_ptr<T> Required(boost::shared_ptr<T> answer, char const* kind, std::string const& name) {
  if (!answer) throw TZEPFailure(kZEPStatusNotFound, std::string("the destination returned no ") + kind + " " + name);
  return answer;
}

}  // namespace NQRVZEP20
