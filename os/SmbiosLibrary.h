#pragma once

#include "core/Handles.h"
#include "platform/include/smbios.h"

#include <memory>

namespace NQRVZEP20 {

// The SMBIOS tables of this machine, open through the platform library libsmbios.so for as long as the object lives.
//
// The library is loaded at run time by its plain name and then stays loaded, so that opening the tables again is cheap.
class TSmbiosTables {
public:
  TSmbiosTables();  // opens them; never throws

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
  using THandle = std::unique_ptr<void, decltype(&smBiosClose)>;

  TSharedLibrary fLibrary;  // outlives the handle
  int fOpenStatus = 0;
  decltype(&smBiosGetFirst) fGetFirst = nullptr;
  THandle fHandle{nullptr, nullptr};

  int Open();
};

}  // namespace NQRVZEP20
