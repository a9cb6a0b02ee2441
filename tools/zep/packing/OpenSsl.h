// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <new>
#include <string>

namespace NQRVZEP20::zep {

template <auto kFree>
struct TFreer {
  template <class T>
  void operator()(T* object) const noexcept {
    kFree(object);
  }
};

// Owns an object of OpenSSL.
template <class T, auto kFree>
using TOpenSsl = std::unique_ptr<T, TFreer<kFree>>;

// Where OpenSSL returns no object because there is no memory.
template <class TOwner>
TOwner OrNoMemory(TOwner owner) {
  if (!owner) throw std::bad_alloc();
  return owner;
}

// Why OpenSSL failed.
struct TReason {
  int fLibrary, fCode;
  std::string fText, fData;
};

// The first reason in OpenSSL's list, which is empty afterwards. Throws std::bad_alloc if it is a lack of memory.
TReason TakeReason();

// Throws std::runtime_error with that reason.
[[noreturn]] void ThrowOpenSslFailure();

}  // namespace NQRVZEP20::zep
