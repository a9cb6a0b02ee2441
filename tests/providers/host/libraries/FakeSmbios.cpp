// SPDX-License-Identifier: Apache-2.0

// A stand-in for libsmbios.so. The environment variable FAKE_SMBIOS names its behaviour. When built with FAKE_WITHOUT_NEXT, it
// lacks smBiosGetNext, which is optional.

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

int CopyStructure(char const* text, void* buffer, int* length) {
  std::string structure("\x01\x08\0\0\0\1\0\0", 8);
  structure += text;
  structure += std::string(2, '\0');
  if (Is("reports too large a length"))
    *length = 1 << 30;
  else if (Is("reports the length 0"))
    *length = 0;
  else if (Is("reports a negative length"))
    *length = -5;
  else
    *length = static_cast<int>(structure.size());
  std::memcpy(buffer, structure.data(), structure.size());
  return kSmbiosOk;
}

}  // namespace

#pragma GCC visibility push(default)

int smBiosLoad(void*, void** handle) {
  *handle = Is("returns no handle") ? nullptr : &gHandle;
  if (Is("is missing its file")) return kSmbiosFileNotFound;
  if (Is("is denied access")) return kSmbiosAccessDenied;
  if (Is("fails")) return kSmbiosFail;
  if (Is("cannot read") || Is("cannot read and leaves no errno")) {
    errno = Is("cannot read") ? EIO : 0;
    return kSmbiosFileSystemError;
  }
  return kSmbiosOk;
}

int smBiosGetFirst(void*, int, void* buffer, int* length) {
  if (Is("has no structure")) return kSmbiosNoMoreItems;
  return CopyStructure("first", buffer, length);
}

#ifndef FAKE_WITHOUT_NEXT
int smBiosGetNext(void*, int, void* buffer, int* length) {
  static int copied = 0;
  if (Is("never ends")) return CopyStructure("again", buffer, length);
  return copied++ < 2 ? CopyStructure("next", buffer, length) : static_cast<int>(kSmbiosNoMoreItems);
}
#endif

int smBiosClose(void*) {
  ++gClosed;
  return kSmbiosOk;
}

extern "C" int FakeSmbiosClosed() { return gClosed; }

#pragma GCC visibility pop
