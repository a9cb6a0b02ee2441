// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// Asks the question on the terminal, and returns whether the answer is "y" or "yes". Blocks until the line is complete; an
// interrupt (Interrupts.h) and the end of the input are a "no". If standard input or standard error is not a terminal, the
// question is not asked, and the result is true.
bool IsConfirmed(std::string const& question);

}  // namespace NQRVZEP20::zep
