// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <exception>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// The exception for a failed assertion, with the complete message. Thrown only while the environment variable
// ZEP_BOOST_ASSERT is "throwboost"; AssertionHandler.h lists the other settings.
class ZEP_EXPORT TBoostAssertException : public std::exception {
public:
  TBoostAssertException(std::string message) : fMessage(std::move(message)) {}
  ~TBoostAssertException() override;

  // "Boost assertion failure! FILE:LINE [EXPRESSION] func = FUNCTION". Valid as long as the exception exists.
  char const* what() const noexcept override;

private:
  std::string fMessage;
};

}  // namespace NQRVZEP20
