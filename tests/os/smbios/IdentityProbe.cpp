// SPDX-License-Identifier: Apache-2.0

// Calls one operation of the machine identification, given by name, and prints its result and then each line it logged,
// all ended by a record separator (0x1E). With PROBE_NO_MEMORY_FOR=N the library gets no buffer of N bytes.

#include "TOSSpecific.h"

#include "tests/Support.h"

#include <cstdio>
#include <cstdlib>
#include <new>

#ifndef ZEP_THREAD_SANITIZER  // which has an operator of its own that cannot be replaced
void* operator new[](std::size_t size, std::nothrow_t const&) noexcept {
  char const* refused = std::getenv("PROBE_NO_MEMORY_FOR");
  if (refused != nullptr && std::to_string(size) == refused) return nullptr;
  return ::operator new[](size);
}
#endif

namespace {

using NQRVZEP20::TOSSpecific;

std::string ResultOf(std::string const& operation) {
  if (operation == "GetMachineType") return TOSSpecific::GetMachineType();
  if (operation == "GetMachineTypeFromID") return TOSSpecific::GetMachineTypeFromID();
  if (operation == "GetBiosID") return TOSSpecific::GetBiosID();
  return TOSSpecific::GetMachineInfo(operation);  // a key
}

}  // namespace

int main(int, char** arguments) {
  NQRVZEP20::TLogCapture const log;
  std::printf("%s\x1E", ResultOf(arguments[1]).c_str());
  for (std::string const& entry : log.Entries()) std::printf("%s\x1E", entry.c_str());
}
