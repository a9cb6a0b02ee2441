// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <memory>
#include <variant>

namespace NQRVZEP20 {

// A value that is kept and seldom looked at: the same as a TCIMValue in less room, which is made again when it is asked for.
// Schemas are made of NULL values, booleans, strings and arrays of strings.
class TStoredValue {
public:
  explicit TStoredValue(TCIMValue const& value);

  TCIMValue Get() const;
  TCIMValue::TCIMType GetType() const { return fType; }
  bool IsFalse() const;  // the boolean value false

private:
  struct TNull {};                           // of no class
  using TStrings = std::unique_ptr<char[]>;  // the count, then each text after its length; numbers of four bytes

  TCIMValue::TCIMType fType;
  unsigned int fMaxArraySize;
  std::variant<TNull, bool, TStrings, std::unique_ptr<TCIMValue>> fData;
};

}  // namespace NQRVZEP20
