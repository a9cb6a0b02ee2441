// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Missing.h"

#include <optional>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// A value or the reason why it is missing, with its source. A plain value: copies share nothing.
template <class T>
struct TAnswer {
  std::optional<T> fValue;  // none when the value is missing
  TMissing fMissing;        // why; only when the value is missing
  std::string fSource;      // where the value comes from, or would come from, in human-readable form; empty if unknown
  std::string fNote;        // a human-readable remark on the value; usually empty

  static TAnswer Known(T value, std::string source) { return {std::move(value), {}, std::move(source), ""}; }
  static TAnswer Unknown(TMissing why, std::string source) { return {std::nullopt, std::move(why), std::move(source), ""}; }

  bool IsKnown() const { return fValue.has_value(); }

  // Whether the value does not apply to this machine, so that nothing is missing.
  bool IsNotApplicable() const { return !IsKnown() && fMissing.fCode == kMissingNotApplicable; }
};

}  // namespace NQRVZEP20
