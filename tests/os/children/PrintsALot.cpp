// SPDX-License-Identifier: Apache-2.0

// Prints the alphabet repeatedly: as many bytes as its argument.
#include <unistd.h>

#include <cstdlib>
#include <string>

int main(int, char** arguments) {
  std::size_t left = std::strtoul(arguments[1], nullptr, 10);
  std::string alphabets;
  while (alphabets.size() < 26 * 1000) alphabets += "abcdefghijklmnopqrstuvwxyz";
  while (left > 0) {
    ssize_t const put = ::write(1, alphabets.data(), left < alphabets.size() ? left : alphabets.size());
    if (put != static_cast<ssize_t>(left < alphabets.size() ? left : alphabets.size())) return 1;
    left -= static_cast<std::size_t>(put);
  }
  return 0;
}
