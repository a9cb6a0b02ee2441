// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/packing/Archive.h"
#include "tools/zep/packing/Checksum.h"
#include "tools/zep/packing/Signature.h"

namespace NQRVZEP20::zep {

// The functions of libzep-packing.so, which are those of Archive.h, Checksum.h and Signature.h. Few commands need them, and
// loading libarchive and libcrypto takes longer than all else at the start of zep. So zep has functions of the same names
// (PackingLoader.cpp): the first call loads the library, or throws TFailure with kExitNoLibrary. The library stays loaded. It is
// part of zep: both are built and installed together.
struct TPackingFunctions {
  decltype(NewArchiveWriter)* fNewArchiveWriter;
  decltype(NewArchiveReader)* fNewArchiveReader;
  decltype(NewSha256)* fNewSha256;
  decltype(NewSigner)* fNewSigner;
  decltype(NewVerifier)* fNewVerifier;
};

// The only function that the library exports.
extern "C" TPackingFunctions const* ZepPacking();

}  // namespace NQRVZEP20::zep
