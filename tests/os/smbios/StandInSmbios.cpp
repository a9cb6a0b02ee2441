// SPDX-License-Identifier: Apache-2.0

// A stand-in for libsmbios.so, controlled by the environment. It records each call.
//
//   STANDIN_RECORD       the file that the calls are written to
//   STANDIN_LOAD_STATUS, STANDIN_GET_STATUS, STANDIN_LENGTH    what is returned; 0, 0 and the structure's length without
//   STANDIN_NO_HANDLE    set: loading sets a null handle
//   STANDIN_STRUCTURE    the file with the structure that is copied

#include "platform/include/smbios.h"

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>

namespace {

int gOpened;  // its address is the handle

void Record(std::string const& call) { std::ofstream(std::getenv("STANDIN_RECORD"), std::ios::app) << call << "\n"; }

int NumberOr(char const* variable, int otherwise) {
  char const* text = std::getenv(variable);
  return text != nullptr ? std::atoi(text) : otherwise;
}

char const* Named(void* handle) { return handle == &gOpened ? "its handle" : handle == nullptr ? "null" : "another handle"; }

}  // namespace

#pragma GCC visibility push(default)

#ifndef STANDIN_WITHOUT_LOAD
int smBiosLoad(void* provider, void** handle) {
  Record(std::string("smBiosLoad(") + Named(provider) + ")");
  *handle = std::getenv("STANDIN_NO_HANDLE") != nullptr ? nullptr : &gOpened;
  return NumberOr("STANDIN_LOAD_STATUS", 0);
}
#endif

#ifndef STANDIN_WITHOUT_GET
int smBiosGetFirst(void* handle, int type, void* buffer, int* length) {
  char* const bytes = static_cast<char*>(buffer);
  bool const isCleared = std::all_of(bytes, bytes + *length, [](char byte) { return byte == 0; });
  Record(std::string("smBiosGetFirst(") + Named(handle) + ", " + std::to_string(type) + ", " + (isCleared ? "cleared" : "used") +
         " buffer, " + std::to_string(*length) + ")");
  if (char const* path = std::getenv("STANDIN_STRUCTURE")) {
    std::ifstream file(path, std::ios::binary);
    file.read(bytes, *length);
    *length = static_cast<int>(file.gcount());
  }
  *length = NumberOr("STANDIN_LENGTH", *length);
  return NumberOr("STANDIN_GET_STATUS", 0);
}
#endif

#ifndef STANDIN_WITHOUT_CLOSE
int smBiosClose(void* handle) {
  Record(std::string("smBiosClose(") + Named(handle) + ")");
  return 0;
}
#endif

#pragma GCC visibility pop
