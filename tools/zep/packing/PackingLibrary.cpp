// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/packing/PackingLibrary.h"

namespace NQRVZEP20::zep {

#pragma GCC visibility push(default)
TPackingFunctions const* ZepPacking() {
  static constexpr TPackingFunctions functions{NewArchiveWriter, NewArchiveReader, NewSha256, NewSigner, NewVerifier};
  return &functions;
}
#pragma GCC visibility pop

}  // namespace NQRVZEP20::zep
