// SPDX-License-Identifier: Apache-2.0

// Prints one line and exits with 3.
#include <cstdio>

int main() {
  std::puts("done");
  return 3;
}
