// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/secrets/TSecret.h"

#include <string>

namespace NQRVZEP20::zep {

// Removes ZEP_BMC_PASSWORD from the environment and overwrites its memory, so that neither /proc/PID/environ nor a program that
// zep starts contains the password. Call this first. With `isNeeded`, a copy is kept for ControllerPassword.
void TakePasswordOutOfTheEnvironment(bool isNeeded);

// Prompts for the password on the controlling terminal ("Password of ...: "), without echo, and blocks until it is entered.
// Signals that terminate or stop the process take effect after the terminal has been restored. Throws std::runtime_error at the
// end of the input, or if there is no terminal; the message then contains `otherwise`, the alternative for the user.
TSecret TypedPassword(std::string const& owner, std::string const& otherwise);

// The password of a controller's account: the first line of `file`, otherwise the environment variable ZEP_BMC_PASSWORD,
// otherwise the password that the user types. Throws std::runtime_error if there is none.
TSecret ControllerPassword(std::string const& user, std::string const& file);

}  // namespace NQRVZEP20::zep
