// SPDX-License-Identifier: Apache-2.0
#include "loaders/SmbiosLibrary.h"

#include "loaders/TKeptLibrary.h"

#include <algorithm>
#include <cerrno>

namespace NQRVZEP20 {
namespace {

using TSmbiosLibrary = TLoadedLibrary<TSmbiosFunctions>;

std::shared_ptr<TSmbiosLibrary const> LibraryFor(TSmbiosTables::ELibraryLife life) {
  if (life == TSmbiosTables::kStaysLoaded) return TKeptLibrary<TSmbiosFunctions>::Get();
  return std::make_shared<TSmbiosLibrary const>();
}

}  // namespace

std::vector<TLibraryFunction> TSmbiosFunctions::Table() {
  return {{"smBiosLoad", fLoad},
          {"smBiosGetFirst", fGetFirst},
          {"smBiosGetNext", fGetNext, TLibraryFunction::kOptional},
          {"smBiosClose", fClose}};
}

TSmbiosTables::TSmbiosTables(ELibraryLife life) : fLibrary(LibraryFor(life)) {
  if (!Library()) return;
  TSmbiosFunctions const& functions = **fLibrary;
  void* handle = nullptr;
  errno = 0;
  fOpenStatus = functions.fLoad(nullptr, &handle);
  fOpenError = errno;
  if (fOpenStatus == kSmbiosOk) fHandle = {handle, functions.fClose};
}

int TSmbiosTables::GetFirst(int type, void* buffer, int size, int& length) {
  return Get((*fLibrary)->fGetFirst, type, buffer, size, length);
}

int TSmbiosTables::GetNext(int type, void* buffer, int size, int& length) {
  return Get((*fLibrary)->fGetNext, type, buffer, size, length);
}

int TSmbiosTables::Get(decltype(smBiosGetFirst)* get, int type, void* buffer, int size, int& length) {
  length = 0;
  if (!HasHandle()) return kSmbiosFail;
  if (get == nullptr) return kSmbiosNoMoreItems;
  int structureLength = size;
  int const status = get(fHandle.get(), type, buffer, &structureLength);
  length = std::clamp(structureLength, 0, size);
  return status;
}

}  // namespace NQRVZEP20
