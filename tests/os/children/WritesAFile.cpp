// SPDX-License-Identifier: Apache-2.0

// Writes its second argument into the file that its first names, and prints an irrelevant text.
#include <cstdio>

int main(int, char** arguments) {
  std::FILE* const file = std::fopen(arguments[1], "w");
  if (file == nullptr) return 1;
  std::fputs(arguments[2], file);
  std::fclose(file);
  std::puts("written");
  return 0;
}
