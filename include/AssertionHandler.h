// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

// Boost's assertion hook. The library defines it for itself and for everything that uses its headers, so that dereferencing
// an empty smart pointer ends here instead of in undefined behaviour.
//
// The environment variable ZEP_BOOST_ASSERT, read at each failure and compared exactly, selects the reaction:
//   "throwzep" or unset   throws TZEPException(kZEPStatusFail); nothing is printed
//   "throwboost"          throws TBoostAssertException with the message
//   "trap"                prints the message and "Forcing segmentation fault." to standard error and returns: no fault is
//                         raised, and execution continues after the failed assertion. Kept.
//   "exit"                prints the message to standard error and calls exit(1)
//   anything else         prints an error message to standard error and throws TZEPException(kZEPStatusFail)
//
// Boost calls the hook only where BOOST_ENABLE_ASSERT_HANDLER is defined; the library's CMake target, its pkg-config file
// and its package define it for their users. The hook may be called on any thread.
namespace boost {

ZEP_EXPORT void assertion_failed(char const* expr, char const* function, char const* file, long line);

// Boost calls this form for assertions that have a message of their own. `msg` is ignored; otherwise the same.
ZEP_EXPORT void assertion_failed_msg(char const* expr, char const* msg, char const* function, char const* file, long line);

}  // namespace boost
