#pragma once

#include <string>

namespace NQRVZEP20::zep {

// What is typed at the terminal of the process, without echo, after "Password of ...: ". A signal that ends or stops a
// program has its effect once the terminal is as it was. Throws std::runtime_error when the input ends, or when there is no
// terminal, with what the user may do otherwise.
std::string TypedPassword(std::string const& owner, std::string const& otherwise);

// The password of a controller's account: the first line of the file named, else the environment variable
// ZEP_BMC_PASSWORD, which is taken out of the environment, else what the user types. Throws std::runtime_error when there is
// none.
std::string ControllerPassword(std::string const& user, std::string const& file);

}  // namespace NQRVZEP20::zep
