// SPDX-License-Identifier: Apache-2.0

// Prints two words and is ended by the signal that its argument names.
#include <signal.h>
#include <unistd.h>

#include <cstdlib>

int main(int, char** arguments) {
  if (::write(1, "last words", 10) != 10) return 1;
  ::kill(::getpid(), std::atoi(arguments[1]));
  return 0;
}
