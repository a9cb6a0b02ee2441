// SPDX-License-Identifier: Apache-2.0

// Prints a chunk that contains a zero byte and, later, a separate chunk without one.
#include <unistd.h>

int main() {
  if (::write(1, "before\0after", 12) != 12) return 1;
  ::sleep(1);
  return ::write(1, "|next", 5) == 5 ? 0 : 1;
}
