// SPDX-License-Identifier: Apache-2.0

// Prints each entry of its environment in brackets.
#include <unistd.h>

#include <cstdio>

int main() {
  for (char** entry = environ; *entry != nullptr; ++entry) std::printf("[%s]", *entry);
  return 0;
}
