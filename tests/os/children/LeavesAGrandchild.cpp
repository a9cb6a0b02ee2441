// SPDX-License-Identifier: Apache-2.0

// Ends at once, but its own child lives on, prints later and holds the output open until then.
#include <unistd.h>

int main() {
  if (::write(1, "child|", 6) != 6) return 1;
  if (::fork() != 0) return 0;
  ::usleep(500000);
  return ::write(1, "grandchild", 10) == 10 ? 0 : 1;
}
