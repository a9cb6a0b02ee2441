#include "os/SmbiosLibrary.h"

#include "TZEPStatusCode.h"

#include <algorithm>

namespace NQRVZEP20 {

TSmbiosTables::TSmbiosTables() : fLibrary(::dlopen("libsmbios.so", RTLD_NOW | RTLD_NODELETE)) { fOpenStatus = Open(); }

int TSmbiosTables::Open() {
  if (!fLibrary) return kZEPStatusFileSystemError;
  auto* const load = FunctionOf<decltype(smBiosLoad)>(fLibrary.get(), "smBiosLoad");
  auto* const close = FunctionOf<decltype(smBiosClose)>(fLibrary.get(), "smBiosClose");
  fGetFirst = FunctionOf<decltype(smBiosGetFirst)>(fLibrary.get(), "smBiosGetFirst");
  if (!load || !close || !fGetFirst) return kZEPStatusNotFound;

  void* handle = nullptr;
  const int status = load(nullptr, &handle);
  if (status == kZEPStatusOK) fHandle = THandle(handle, close);
  return status;
}

int TSmbiosTables::GetFirst(int type, char* buffer, int size, int& length) {
  length = 0;
  if (!HasHandle()) return kZEPStatusFail;
  int structureLength = size;
  const int status = fGetFirst(fHandle.get(), type, buffer, &structureLength);
  length = std::clamp(structureLength, 0, size);
  return status;
}

}  // namespace NQRVZEP20
