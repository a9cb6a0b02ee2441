// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Missing.h"

#include <optional>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// A value, or the reason why it is missing; and its source. A plain value: copies share nothing.
template <class T>
struct TAnswer {
  std::optional<T> fValue;  // none when the value is missing
  TMissing fMissing;        // why; only when the value is missing
  std::string fSource;      // where the value comes from, or would come from: a short text for people; empty when unknown
  std::string fNote;        // a remark on the value, for people; mostly empty

  static TAnswer Known(T value, std::string source) { return {std::move(value), {}, std::move(source), ""}; }
  static TAnswer Unknown(TMissing why, std::string source) { return {std::nullopt, std::move(why), std::move(source), ""}; }

  bool IsKnown() const { return fValue.has_value(); }

  // Whether this machine has no such value and needs none: then nothing is missing.
  bool IsNotApplicable() const { return !IsKnown() && fMissing.fCode == kMissingNotApplicable; }
};

}  // namespace NQRVZEP20
