// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/secrets/TSecret.h"

#include <string>

namespace NQRVZEP20::zep {

// To be called first of all: takes ZEP_BMC_PASSWORD out of the environment and overwrites it where it stood, so that neither
// /proc/PID/environ nor a program that zep starts has it. It is kept, for ControllerPassword, only where it `isNeeded`.
void TakePasswordOutOfTheEnvironment(bool isNeeded);

// What is typed at the terminal of the process, without echo, after "Password of ...: ". A signal that ends or stops a
// program has its effect once the terminal is as it was. Throws std::runtime_error when the input ends, or when there is no
// terminal, with what the user may do otherwise.
TSecret TypedPassword(std::string const& owner, std::string const& otherwise);

// The password of a controller's account: the first line of the file named, else the environment variable ZEP_BMC_PASSWORD,
// else what the user types. Throws std::runtime_error when there is none.
TSecret ControllerPassword(std::string const& user, std::string const& file);

}  // namespace NQRVZEP20::zep
