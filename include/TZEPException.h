// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"

#include <exception>

namespace NQRVZEP20 {

// The library's exception type, which has a status code. Catch it by reference: `catch (TZEPException const& e)`.
class ZEP_EXPORT TZEPException : public std::exception {
public:
  TZEPException(TZEPStatusCode code) noexcept : fStatusCode(code) {}
  TZEPException(EZEPStatusCode code) noexcept : fStatusCode(code) {}
  ~TZEPException() override;

  // The name of the held code, such as "kZEPStatusTypeMismatch". Valid until the end of the process.
  char const* what() const noexcept override;

  TZEPStatusCode const& GetStatusCode() const noexcept { return fStatusCode; }

private:
  TZEPStatusCode fStatusCode;
};

}  // namespace NQRVZEP20
