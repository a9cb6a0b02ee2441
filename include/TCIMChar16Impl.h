// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

// The body of a TCIMChar16: a 16-bit character code, or NULL.
class ZEP_EXPORT TCIMChar16Impl {
public:
  TCIMChar16Impl() noexcept = default;  // code 0
  TCIMChar16Impl(unsigned short code) noexcept : fCode(code) {}

  // Makes a NULL character, regardless of the text. Kept.
  TCIMChar16Impl(std::string const& text) noexcept;

  unsigned short GetValue() const noexcept { return fCode; }

  // The code in decimal. Throws kZEPStatusInvalidDateTime for a NULL character.
  std::string ToString() const;

  // All four operators return true, regardless of the codes. They throw kZEPStatusInvalidDateTime when either character is
  // NULL. Kept. An empty pointer is a failed assertion.
  bool operator==(TCIMChar16Impl const& other) const;
  bool operator<(TCIMChar16Impl const& other) const;
  bool operator==(boost::shared_ptr<TCIMChar16Impl> const& other) const;
  bool operator<(boost::shared_ptr<TCIMChar16Impl> const& other) const;

private:
  bool fIsNull = false;
  unsigned short fCode = 0;
};

}  // namespace NQRVZEP20
