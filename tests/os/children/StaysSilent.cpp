// SPDX-License-Identifier: Apache-2.0

// Prints its process number and stays silent until it is ended, for half a minute at most.
#include <unistd.h>

#include <cstdio>

int main() {
  std::printf("%d\n", static_cast<int>(::getpid()));
  std::fflush(stdout);
  ::sleep(30);
  return 0;
}
