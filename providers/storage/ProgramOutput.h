// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <chrono>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The path of a program: in the directories of PATH, or else in those for system administration. Empty if there is none.
std::string FindProgram(std::string const& name);

// Runs a program, by its path, with these arguments, and returns what it writes to its standard output. The exit status is not
// considered. The input is empty; standard error is discarded. Missing if the program cannot be started, if it writes more than 4
// MiB, or if it has not closed its output at `deadline`; it is then killed. A program that the kernel does not let die, because a
// disk does not answer, is not waited for. Several threads may call it at the same time.
TFinding<std::string> OutputOf(std::string const& program, std::vector<std::string> const& arguments,
                               std::chrono::steady_clock::time_point deadline);

}  // namespace NQRVZEP20
