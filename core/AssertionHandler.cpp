// SPDX-License-Identifier: Apache-2.0
#include "AssertionHandler.h"

#include "TBoostAssertException.h"
#include "TRootObject.h"
#include "TZEPException.h"

#include <cstdlib>
#include <iostream>
#include <locale>
#include <sstream>

namespace NQRVZEP20 {
namespace {

// A null argument puts the stream into its error state, which drops the rest of the message.
std::string MessageOf(char const* expr, char const* function, char const* file, long line) {
  std::ostringstream message;
  message.imbue(std::locale::classic());
  message << "Boost assertion failure! " << file << ":" << line << " [" << expr << "] func = " << function;
  return message.str();
}

void HandleFailedAssertion(char const* expr, char const* function, char const* file, long line) {
  char const* const setting = std::getenv("ZEP_BOOST_ASSERT");
  std::string const mode = setting ? setting : "throwzep";
  std::string const message = MessageOf(expr, function, file, line);
  TRootObject::GetCoreLogger();  // creates the thread's logger, although nothing is logged. Kept.

  if (mode == "throwzep") throw TZEPException(kZEPStatusFail);
  if (mode == "throwboost") throw TBoostAssertException(message);
  if (mode == "trap") {
    std::cerr << std::endl << message << std::endl << std::endl << "Forcing segmentation fault." << std::endl;
    return;  // no fault is raised, and the caller continues. Kept.
  }
  if (mode == "exit") {
    std::cerr << std::endl << message << std::endl;
    std::exit(1);
  }
  std::cerr << "Invalid setting for ZEP_BOOST_ASSERT '" << mode << "'. Valid values are {throwzep, throwboost, trap, exit}."
            << std::endl;
  throw TZEPException(kZEPStatusFail);
}

}  // namespace
}  // namespace NQRVZEP20

void boost::assertion_failed(char const* expr, char const* function, char const* file, long line) {
  NQRVZEP20::HandleFailedAssertion(expr, function, file, line);
}

void boost::assertion_failed_msg(char const* expr, char const*, char const* function, char const* file, long line) {
  NQRVZEP20::HandleFailedAssertion(expr, function, file, line);
}
