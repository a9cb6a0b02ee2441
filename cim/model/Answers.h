#pragma once

#include "TZEPException.h"

#include <boost/shared_ptr.hpp>

namespace NQRVZEP20 {

// What the destination of a copy answered; throws kZEPStatusNotFound when that is an empty pointer.
template <class T>
boost::shared_ptr<T> Required(boost::shared_ptr<T> answer) {
  if (!answer) throw TZEPException(kZEPStatusNotFound);
  return answer;
}

}  // namespace NQRVZEP20
