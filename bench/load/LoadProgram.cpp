// SPDX-License-Identifier: Apache-2.0

// Loads the library named by its argument, resolving all symbols at once, and prints the time in nanoseconds. It is a C++
// program, as every host is, so the C++ library is already loaded.

#include <dlfcn.h>

#include <chrono>
#include <iostream>

int main(int, char** arguments) {
  auto const start = std::chrono::steady_clock::now();
  void* const library = ::dlopen(arguments[1], RTLD_NOW | RTLD_GLOBAL);
  auto const end = std::chrono::steady_clock::now();
  if (library == nullptr) {
    std::cerr << ::dlerror() << "\n";
    return 1;
  }
  std::cout << std::chrono::nanoseconds(end - start).count() << "\n";
}
