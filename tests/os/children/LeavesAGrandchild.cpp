// SPDX-License-Identifier: Apache-2.0

// Ends immediately, but its child continues to run, keeps the output open, and prints later.
#include <unistd.h>

int main() {
  if (::write(1, "child|", 6) != 6) return 1;
  if (::fork() != 0) return 0;
  ::usleep(500000);
  return ::write(1, "grandchild", 10) == 10 ? 0 : 1;
}
