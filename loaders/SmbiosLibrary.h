// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "loaders/TLoadedLibrary.h"
#include "platform/include/smbios.h"

#include <memory>
#include <vector>

namespace NQRVZEP20 {

// The functions of the platform library libsmbios.so, which is loaded by its plain name.
struct TSmbiosFunctions {
  decltype(smBiosLoad)* fLoad = nullptr;
  decltype(smBiosGetFirst)* fGetFirst = nullptr;
  decltype(smBiosGetNext)* fGetNext = nullptr;  // null in a library that lacks it
  decltype(smBiosClose)* fClose = nullptr;

  static TLibraryPlace Place() { return {{"libsmbios.so"}, RTLD_NOW}; }
  std::vector<TLibraryFunction> Table();
};

// The SMBIOS tables, which libsmbios.so keeps open as long as the object exists.
class TSmbiosTables {
public:
  enum ELibraryLife {
    kStaysLoaded,      // the library is loaded on first use and stays loaded; while loading fails, each object tries again
    kClosedWithTables  // each object loads and unloads the library
  };

  // Opens the tables. Never throws.
  explicit TSmbiosTables(ELibraryLife life);

  // The outcome of loading the library.
  TLoadOutcome const& Library() const { return fLibrary->Outcome(); }

  // The library's status on opening; meaningless when the library could not be loaded.
  int OpenStatus() const { return fOpenStatus; }

  // The value of errno after opening; 0 if the library did not set it.
  int OpenError() const { return fOpenError; }

  // Whether the library returned a handle. A library may report success without returning one.
  bool HasHandle() const { return fHandle != nullptr; }

  // Copies the first structure of that type into the buffer of `size` bytes, which the caller has cleared. Returns the
  // library's status, or kSmbiosFail without a handle. `length` becomes 0 to `size`, whatever length the library reports.
  int GetFirst(int type, void* buffer, int size, int& length);

  // The same for the next structure of that type. Returns kSmbiosNoMoreItems with a library that lacks smBiosGetNext.
  int GetNext(int type, void* buffer, int size, int& length);

  void Close() { fHandle.reset(); }

private:
  int Get(decltype(smBiosGetFirst)* get, int type, void* buffer, int size, int& length);

  std::shared_ptr<TLoadedLibrary<TSmbiosFunctions> const> const fLibrary;
  int fOpenStatus = kSmbiosFail;
  int fOpenError = 0;
  std::unique_ptr<void, decltype(smBiosClose)*> fHandle{nullptr, nullptr};
};

}  // namespace NQRVZEP20
