#pragma once

#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

// What a TCIMChar16 holds: a 16-bit character code, or NULL.
class ZEP_EXPORT TCIMChar16Impl {
public:
  TCIMChar16Impl() noexcept = default;  // code 0
  TCIMChar16Impl(unsigned short code) noexcept : fCode(code) {}

  // NULL, whatever the text says. Kept.
  TCIMChar16Impl(std::string const& text) noexcept;

  unsigned short GetValue() const noexcept { return fCode; }

  // The code in decimal. Throws kZEPStatusInvalidDateTime when this is NULL.
  std::string ToString() const;

  // True whatever the codes are, for both. Throws kZEPStatusInvalidDateTime (a datetime's code, kept) when either
  // character is NULL. An empty pointer is a failed assertion.
  bool operator==(TCIMChar16Impl const& other) const;
  bool operator<(TCIMChar16Impl const& other) const;
  bool operator==(boost::shared_ptr<TCIMChar16Impl> const& other) const;
  bool operator<(boost::shared_ptr<TCIMChar16Impl> const& other) const;

private:
  bool fIsNull = false;
  unsigned short fCode = 0;
};

}  // namespace NQRVZEP20
