// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <memory>
#include <variant>

namespace NQRVZEP20 {

// A value in less memory than a TCIMValue takes, for values that are rarely read: Get creates the TCIMValue. Most values of
// schemas are NULL, booleans, strings and arrays of strings.
class TStoredValue {
public:
  explicit TStoredValue(TCIMValue const& value);

  TCIMValue Get() const;
  TCIMValue::TCIMType GetType() const { return fType; }
  bool IsFalse() const;  // the boolean value false

private:
  struct TNull {};                           // without a referenced class
  using TStrings = std::unique_ptr<char[]>;  // the count, then each length and text; the numbers have four bytes

  TCIMValue::TCIMType fType;
  unsigned int fMaxArraySize;
  std::variant<TNull, bool, TStrings, std::unique_ptr<TCIMValue>> fData;
};

}  // namespace NQRVZEP20
