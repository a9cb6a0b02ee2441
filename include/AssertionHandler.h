// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

// Boost's assertion handler. The library defines it for itself and for all code that uses its headers, so that dereferencing
// an empty boost::shared_ptr calls this handler instead of being undefined behaviour.
//
// The environment variable ZEP_BOOST_ASSERT, read at each failure and compared exactly, selects the reaction:
//   "throwzep" or unset   throws TZEPException(kZEPStatusFail); nothing is printed
//   "throwboost"          throws TBoostAssertException with the message
//   "trap"                prints the message and "Forcing segmentation fault." to standard error and returns: no fault is
//                         raised, and execution continues after the failed assertion. Kept.
//   "exit"                prints the message to standard error and calls exit(1)
//   anything else         prints an error message to standard error and throws TZEPException(kZEPStatusFail)
//
// Boost calls the handler only from code that is compiled with BOOST_ENABLE_ASSERT_HANDLER; the library's CMake targets and
// its pkg-config file define that macro for their users. The handler may be called on any thread.
namespace boost {

ZEP_EXPORT void assertion_failed(char const* expr, char const* function, char const* file, long line);

// Boost calls this overload for assertions that have their own message. It ignores `msg` and otherwise does the same.
ZEP_EXPORT void assertion_failed_msg(char const* expr, char const* msg, char const* function, char const* file, long line);

}  // namespace boost
