#pragma once

#include "ZEPExport.h"

// Boost's assertion hook, which this library defines for itself and for everything that uses its headers: a smart pointer
// that is used while it is empty ends here instead of in undefined behaviour.
//
// The environment variable ZEP_BOOST_ASSERT, read at each failure and compared exactly, chooses what happens:
//   "throwzep" or unset   throws TZEPException(kZEPStatusFail); nothing is printed
//   "throwboost"          throws TBoostAssertException with the message
//   "trap"                prints the message and "Forcing segmentation fault." to standard error and returns: no fault is
//                         raised, and the caller goes on with its failed assertion. Kept.
//   "exit"                prints the message to standard error and calls exit(1)
//   anything else         prints a complaint to standard error and throws TZEPException(kZEPStatusFail)
//
// Boost calls the hook only where BOOST_ENABLE_ASSERT_HANDLER is defined; the library's CMake target, its pkg-config file
// and its package define it for their users. Any thread may fail an assertion.
namespace boost {

ZEP_EXPORT void assertion_failed(char const* expr, char const* function, char const* file, long line);

// The form that Boost calls for assertions with a message of their own; the message is not shown.
ZEP_EXPORT void assertion_failed_msg(char const* expr, char const* msg, char const* function, char const* file, long line);

}  // namespace boost
