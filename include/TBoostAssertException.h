#pragma once

#include "ZEPExport.h"

#include <exception>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// A failed internal assertion as an exception that carries the whole message. Only thrown while the environment variable
// ZEP_BOOST_ASSERT is "throwboost"; otherwise a failed assertion is a TZEPException (see AssertionHandler.h).
class ZEP_EXPORT TBoostAssertException : public std::exception {
public:
  TBoostAssertException(std::string message) : fMessage(std::move(message)) {}
  ~TBoostAssertException() override;

  // "Boost assertion failure! FILE:LINE [EXPRESSION] func = FUNCTION". Valid as long as the exception.
  char const* what() const noexcept override;

private:
  std::string fMessage;
};

}  // namespace NQRVZEP20
