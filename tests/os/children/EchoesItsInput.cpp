// SPDX-License-Identifier: Apache-2.0
#include <cstdio>

int main() {
  for (int c; (c = std::getchar()) != EOF;) std::putchar(c);
  return 0;
}
