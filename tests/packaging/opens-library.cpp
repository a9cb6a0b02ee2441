// SPDX-License-Identifier: Apache-2.0

// Opens libzepcore.so by its path, and ends with 0 if that is the library with which this program is linked.
//
//   opens-library FILE

#include <TOSSpecific.h>

#include <dlfcn.h>

#include <iostream>

int main(int, char** arguments) {
  std::cout << NQRVZEP20::TOSSpecific::GetZEPRootPath() << std::endl;
  void* const linked = ::dlopen("libzepcore.so.1", RTLD_NOW | RTLD_NOLOAD);
  void* const opened = ::dlopen(arguments[1], RTLD_NOW);
  return linked != nullptr && linked == opened ? 0 : 1;
}
