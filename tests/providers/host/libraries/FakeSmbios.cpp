// SPDX-License-Identifier: Apache-2.0

// A stand-in for libsmbios.so, with the behaviour that the environment variable FAKE_SMBIOS names. Built with
// FAKE_WITHOUT_NEXT it lacks smBiosGetNext, as a library may.

#include "platform/include/smbios.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

int gHandle;
int gClosed = 0;

bool Is(char const* behaviour) {
  char const* chosen = std::getenv("FAKE_SMBIOS");
  return chosen != nullptr && std::strcmp(chosen, behaviour) == 0;
}

int Hand(char const* text, void* buffer, int* length) {
  std::string structure("\x01\x08\0\0\0\1\0\0", 8);
  structure += text;
  structure += std::string(2, '\0');
  if (Is("lies about the length"))
    *length = 1 << 30;
  else if (Is("says no length"))
    *length = 0;
  else if (Is("says a negative length"))
    *length = -5;
  else
    *length = static_cast<int>(structure.size());
  std::memcpy(buffer, structure.data(), structure.size());
  return kSmbiosOk;
}

}  // namespace

#pragma GCC visibility push(default)

int smBiosLoad(void*, void** handle) {
  *handle = Is("hands out no handle") ? nullptr : &gHandle;
  if (Is("finds no file")) return kSmbiosFileNotFound;
  if (Is("is denied access")) return kSmbiosAccessDenied;
  if (Is("fails")) return kSmbiosFail;
  if (Is("cannot read") || Is("cannot read and tells no reason")) {
    errno = Is("cannot read") ? EIO : 0;
    return kSmbiosFileSystemError;
  }
  return kSmbiosOk;
}

int smBiosGetFirst(void*, int, void* buffer, int* length) {
  if (Is("has no structure")) return kSmbiosNoMoreItems;
  return Hand("first", buffer, length);
}

#ifndef FAKE_WITHOUT_NEXT
int smBiosGetNext(void*, int, void* buffer, int* length) {
  static int handed = 0;
  if (Is("never ends")) return Hand("again", buffer, length);
  return handed++ < 2 ? Hand("next", buffer, length) : static_cast<int>(kSmbiosNoMoreItems);
}
#endif

int smBiosClose(void*) {
  ++gClosed;
  return kSmbiosOk;
}

extern "C" int FakeSmbiosClosed() { return gClosed; }

#pragma GCC visibility pop
