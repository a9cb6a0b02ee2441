// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/secrets/TSecret.h"

#include <string>

namespace NQRVZEP20::zep {

// Call this first: it removes ZEP_BMC_PASSWORD from the environment and overwrites its memory, so that neither /proc/PID/environ
// nor a program that zep starts has the password. With `isNeeded` it is kept for ControllerPassword.
void TakePasswordOutOfTheEnvironment(bool isNeeded);

// Asks on the terminal of the process with "Password of ...: ", without echo. A signal that ends or stops a program has its
// effect after the terminal has been restored. Throws std::runtime_error when the input ends, or when there is no terminal; the
// message then contains `otherwise`, the alternative for the user.
TSecret TypedPassword(std::string const& owner, std::string const& otherwise);

// The password of a controller's account: the first line of `file`, otherwise the environment variable ZEP_BMC_PASSWORD,
// otherwise the password that the user types. Throws std::runtime_error when there is none.
TSecret ControllerPassword(std::string const& user, std::string const& file);

}  // namespace NQRVZEP20::zep
