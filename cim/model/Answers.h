// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"

#include <boost/shared_ptr.hpp>

namespace NQRVZEP20 {

// Returns `answer`, a pointer that the destination of a copy returned; throws kZEPStatusNotFound when it is empty.
template <class T>
boost::shared_ptr<T> Required(boost::shared_ptr<T> answer) {
  if (!answer) throw TZEPException(kZEPStatusNotFound);
  return answer;
}

}  // namespace NQRVZEP20
