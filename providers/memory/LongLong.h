// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <type_traits>

namespace NQRVZEP20 {

// A TCIMValue is made from every integer type but long long and unsigned long long, for which its constructors are ambiguous.
// Operations that take a value by name have one more form for these two:
//
//   template <class T, IfLongLong<T> = 0>
//   void Set(std::string const& name, T number) { Set(name, FromLongLong(number)); }
template <class T>
using IfLongLong = std::enable_if_t<std::is_same_v<T, long long> || std::is_same_v<T, unsigned long long>, int>;

inline TCIMValue FromLongLong(long long number) {
  static_assert(sizeof(long) == sizeof(long long));
  return TCIMValue(static_cast<long>(number));
}

inline TCIMValue FromLongLong(unsigned long long number) { return TCIMValue(static_cast<unsigned long>(number)); }

}  // namespace NQRVZEP20
