// SPDX-License-Identifier: Apache-2.0

// Prints more than one chunk at once, with a zero byte in the first.
#include <unistd.h>

#include <string>

int main() {
  std::string text(10000, 'x');
  text[100] = '\0';
  return ::write(1, text.data(), text.size()) == static_cast<ssize_t>(text.size()) ? 0 : 1;
}
