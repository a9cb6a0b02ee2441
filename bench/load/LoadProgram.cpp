// Loads the library that it is given, with all symbols resolved at once, and prints how many nanoseconds that took. A C++
// program, as every host is: the C++ library is there already.

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
