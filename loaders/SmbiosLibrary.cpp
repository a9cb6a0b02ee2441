// SPDX-License-Identifier: Apache-2.0
#include "loaders/SmbiosLibrary.h"

#include "TZEPException.h"
#include "core/Handles.h"

#include <algorithm>

namespace NQRVZEP20 {
namespace {

struct TSmbiosFunctions {
  decltype(&smBiosLoad) load;
  decltype(&smBiosGetFirst) getFirst;
  decltype(&smBiosClose) close;
};

TSmbiosFunctions LoadFunctions() {
  TSharedLibrary library(::dlopen("libsmbios.so", RTLD_NOW));
  if (!library) throw TZEPException(kZEPStatusFileSystemError);
  TSmbiosFunctions const functions = {FunctionOf<decltype(smBiosLoad)>(library.get(), "smBiosLoad"),
                                      FunctionOf<decltype(smBiosGetFirst)>(library.get(), "smBiosGetFirst"),
                                      FunctionOf<decltype(smBiosClose)>(library.get(), "smBiosClose")};
  if (!functions.load || !functions.getFirst || !functions.close) throw TZEPException(kZEPStatusNotFound);
  library.release();  // stays loaded
  return functions;
}

// When LoadFunctions throws, the next call tries again.
TSmbiosFunctions const& Functions() {
  static TSmbiosFunctions const functions = LoadFunctions();
  return functions;
}

}  // namespace

TSmbiosTables::TSmbiosTables() {
  try {
    TSmbiosFunctions const& functions = Functions();
    void* handle = nullptr;
    fOpenStatus = functions.load(nullptr, &handle);
    if (fOpenStatus == kZEPStatusOK) fHandle = {handle, functions.close};
  } catch (TZEPException const& failed) {
    fOpenStatus = failed.GetStatusCode().GetCode();
  }
}

int TSmbiosTables::GetFirst(int type, char* buffer, int size, int& length) {
  length = 0;
  if (!HasHandle()) return kZEPStatusFail;
  int structureLength = size;
  int const status = Functions().getFirst(fHandle.get(), type, buffer, &structureLength);
  length = std::clamp(structureLength, 0, size);
  return status;
}

}  // namespace NQRVZEP20
