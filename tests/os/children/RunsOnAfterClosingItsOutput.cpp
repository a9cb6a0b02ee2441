// SPDX-License-Identifier: Apache-2.0

// Closes both its outputs, runs on for a while and exits with its argument.
#include <unistd.h>

#include <cstdlib>

int main(int, char** arguments) {
  if (::write(1, "closing", 7) != 7) return 1;
  ::close(1);
  ::close(2);
  ::usleep(300000);
  return std::atoi(arguments[1]);
}
