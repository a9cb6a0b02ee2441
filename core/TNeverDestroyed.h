// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <new>
#include <utility>

namespace NQRVZEP20 {

// A T that is made with this object and never destroyed: for a static object that code may still use while other static
// objects are destroyed. It is stored in place, so that a leak checker finds everything that it owns.
//
//   static TNeverDestroyed<TCache> cache;
//   cache->Clear();
template <class T>
class TNeverDestroyed {
public:
  template <class... TArguments>
  explicit TNeverDestroyed(TArguments&&... arguments) : fObject(new (fPlace) T(std::forward<TArguments>(arguments)...)) {}
  TNeverDestroyed(TNeverDestroyed const&) = delete;
  TNeverDestroyed& operator=(TNeverDestroyed const&) = delete;

  T& operator*() { return *fObject; }
  T* operator->() { return fObject; }

private:
  alignas(T) unsigned char fPlace[sizeof(T)];
  T* const fObject;
};

}  // namespace NQRVZEP20
