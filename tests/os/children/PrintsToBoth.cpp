// SPDX-License-Identifier: Apache-2.0

// Prints to standard output and standard error in turn.
#include <unistd.h>

int main() {
  bool const all =
      ::write(1, "out1 ", 5) == 5 && ::write(2, "err1 ", 5) == 5 && ::write(1, "out2 ", 5) == 5 && ::write(2, "err2", 4) == 4;
  return all ? 0 : 1;
}
