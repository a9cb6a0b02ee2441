// SPDX-License-Identifier: Apache-2.0

// Prints a full stop and waits for as many milliseconds as its first argument; repeats this as often as its second argument.
#include <unistd.h>

#include <cstdlib>

int main(int, char** arguments) {
  for (int left = std::atoi(arguments[2]); left > 0; --left) {
    if (::write(1, ".", 1) != 1) return 1;
    ::usleep(static_cast<useconds_t>(std::atoi(arguments[1])) * 1000);
  }
  return 0;
}
