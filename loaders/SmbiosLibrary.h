// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/include/smbios.h"

#include <memory>

namespace NQRVZEP20 {

// The SMBIOS tables of this machine, open through the platform library libsmbios.so for as long as the object lives.
//
// The library is loaded by its plain name when first needed and then stays loaded; while it cannot be had, each new object
// tries again.
class TSmbiosTables {
public:
  TSmbiosTables();  // opens them; throws nothing

  // What the library said of opening; kZEPStatusFileSystemError when it could not be loaded, kZEPStatusNotFound when it
  // lacks one of its functions.
  int OpenStatus() const { return fOpenStatus; }

  // A library may say that all went well and hand out nothing.
  bool HasHandle() const { return fHandle != nullptr; }

  // Copies the first structure of that type into the buffer of `size` bytes, which the caller has cleared, and returns
  // the library's status; kZEPStatusFail without a handle. `length` lies within 0 to `size`, whatever the library says.
  int GetFirst(int type, char* buffer, int size, int& length);

  void Close() { fHandle.reset(); }

private:
  int fOpenStatus = 0;
  std::unique_ptr<void, decltype(&smBiosClose)> fHandle{nullptr, nullptr};
};

}  // namespace NQRVZEP20
