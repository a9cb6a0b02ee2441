// SPDX-License-Identifier: Apache-2.0

// Prints each of its arguments, its name among them, in brackets.
#include <cstdio>

int main(int, char** arguments) {
  for (; *arguments != nullptr; ++arguments) std::printf("[%s]", *arguments);
  return 0;
}
