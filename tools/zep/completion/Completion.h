// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

// The names of the shells: "bash", "fish", "zsh".
std::vector<std::string> ShellsWithCompletion();

// The script with which a shell completes the command line of zep: its commands, their options, and the values of an option that
// takes one of a list. `shell` is one of ShellsWithCompletion.
std::string CompletionFor(std::string const& shell, CLI::App const& zep);

}  // namespace NQRVZEP20::zep
