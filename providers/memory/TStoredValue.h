// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <cstdint>
#include <memory>
#include <variant>

namespace NQRVZEP20 {

// A value in less memory than a TCIMValue takes: Get creates the TCIMValue. A number is kept in place, a string or an array of
// numbers or strings in one block of memory, and everything else, such as a datetime or a reference, as a TCIMValue.
class TStoredValue {
public:
  explicit TStoredValue(TCIMValue const& value);

  TCIMValue Get() const;
  TCIMValue::TCIMType GetType() const { return fType; }
  bool IsFalse() const;  // the boolean value false

private:
  struct TNull {};  // without a referenced class
  using TBlock = std::unique_ptr<char[]>;

  TCIMValue::TCIMType fType;
  unsigned int fMaxArraySize;
  std::variant<TNull, std::uint64_t, TBlock, std::unique_ptr<TCIMValue>> fData;
};

}  // namespace NQRVZEP20
