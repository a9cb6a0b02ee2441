#pragma once

#include <string>

namespace NQRVZEP20::zep {

// The password of a controller's account: the first line of the file named, else the environment variable
// ZEP_BMC_PASSWORD, which is taken out of the environment, else what the user types at the terminal, without echo. Throws
// std::runtime_error when there is none.
std::string AskForPassword(std::string const& user, std::string const& file);

}  // namespace NQRVZEP20::zep
