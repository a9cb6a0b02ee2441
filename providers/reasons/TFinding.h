// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Missing.h"

#include <type_traits>
#include <utility>
#include <variant>

namespace NQRVZEP20 {

template <class T>
class TFinding;

// The TFinding type for the result type of a function: TFinding<int> for int and for TFinding<int>.
template <class T>
struct TFindingOf {
  using TType = TFinding<T>;
};
template <class T>
struct TFindingOf<TFinding<T>> {
  using TType = TFinding<T>;
};

// A value, or the reason why it is missing.
//
// A plain value; copies are as deep as those of its value. A function that may fail returns its result or a TMissing:
//
//   TFinding<int> PortFrom(std::string const& text) {
//     if (!IsNumber(text)) return TMissing{kMissingUnexpected, "\"" + text + "\" is not a number"};
//     return std::stoi(text);
//   }
template <class T>
class TFinding {
public:
  static_assert(!std::is_same_v<T, TMissing>);

  TFinding(T value) : fContent(std::move(value)) {}
  TFinding(TMissing why) : fContent(std::move(why)) {}

  // True when there is a value.
  explicit operator bool() const { return std::holds_alternative<T>(fContent); }

  // The value. Both throw std::bad_variant_access when it is missing.
  T const& operator*() const { return std::get<T>(fContent); }
  T const* operator->() const { return &std::get<T>(fContent); }

  // Throws std::bad_variant_access when there is a value.
  TMissing const& Why() const { return std::get<TMissing>(fContent); }

  // Passes the value to `next` and returns the result of `next`, which is a value or a finding. If the value is missing, the
  // result is missing for the same reason, and `next` is not called.
  //
  //   ReadLine(file).Then(PortFrom)
  //   PortFrom(text).Then([](int port) { return port + 1; })
  template <class TFunction>
  auto Then(TFunction&& next) const {
    using TResult = typename TFindingOf<std::decay_t<std::invoke_result_t<TFunction, T const&>>>::TType;
    if (!*this) return TResult(Why());
    return TResult(std::forward<TFunction>(next)(**this));
  }

private:
  std::variant<T, TMissing> fContent;
};

}  // namespace NQRVZEP20
