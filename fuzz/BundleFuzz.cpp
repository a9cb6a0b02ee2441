// SPDX-License-Identifier: Apache-2.0

// Checks any bytes as a bundle, without a trusted signer. One that is refused has a reason, and so has each difference.

#include "fuzz/Require.h"
#include "tools/zep/bundle/CheckBundle.h"
#include "tools/zep/packing/Archive.h"

#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>
#include <string>

using namespace NQRVZEP20::zep;

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  static int const file = ::memfd_create("bundle", MFD_CLOEXEC);
  Require(::ftruncate(file, 0) == 0 && ::pwrite(file, data, size, 0) == static_cast<ssize_t>(size));
  try {
    TBundleCheck const check = CheckBundle("/proc/self/fd/" + std::to_string(file), {});
    for (TBundleDifference const& row : check.fDifferences) Require(!row.fReason.empty() && row.fMember.size() <= 1000);
    Require(!check.IsRight() || check.fSigner.empty() != check.fManifest.fIsSigned);
  } catch (TArchiveError const& failure) {
    Require(*failure.what() != '\0');
  }
  return 0;
}
