// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/packing/PackingLibrary.h"

#include "loaders/TKeptLibrary.h"
#include "tools/zep/output/Failure.h"

#include <dlfcn.h>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kFile = "libzep-packing.so";

struct TPackingLibrary {
  decltype(ZepPacking)* fFunctions = nullptr;

  static TLibraryPlace Place() { return {{kFile}, RTLD_NOW}; }
  std::vector<TLibraryFunction> Table() { return {{"ZepPacking", fFunctions}}; }
};

// Throws TFailure with kExitNoLibrary if the library cannot be loaded.
TPackingFunctions const& Packing() {
  auto const library = TKeptLibrary<TPackingLibrary>::Get();
  if (TLoadOutcome const& outcome = library->Outcome(); !outcome)
    throw TFailure(kExitNoLibrary, std::string(kFile) + " cannot be loaded: " + outcome.fReason +
                                       "; it is part of zep, and needs libarchive and OpenSSL's libcrypto: install the "
                                       "package zep again, with the packages that it needs");
  return *(*library)->fFunctions();
}

}  // namespace

std::unique_ptr<TArchiveWriter> NewArchiveWriter() { return Packing().fNewArchiveWriter(); }
std::unique_ptr<TArchiveReader> NewArchiveReader(std::string const& file) { return Packing().fNewArchiveReader(file); }
std::unique_ptr<TSha256> NewSha256() { return Packing().fNewSha256(); }
std::unique_ptr<TSigner> NewSigner(TPem const& key, TPem const& certificates) { return Packing().fNewSigner(key, certificates); }
std::unique_ptr<TVerifier> NewVerifier(ETrusted trusted, TPem const& certificates) {
  return Packing().fNewVerifier(trusted, certificates);
}

}  // namespace NQRVZEP20::zep
