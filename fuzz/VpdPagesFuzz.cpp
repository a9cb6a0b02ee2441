// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as each page of vital product data. Each finding must have a value or a reason.

#include "fuzz/Require.h"
#include "providers/storage/VpdPages.h"

namespace {

template <class T>
void RequireWhole(NQRVZEP20::TFinding<T> const& finding) {
  Require(finding || (!finding.Why().fCode.empty() && !finding.Why().fReason.empty()));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string_view const page(reinterpret_cast<char const*>(data), size);
  RequireWhole(NQRVZEP20::SerialNumberFrom(page));
  NQRVZEP20::TAtaIdentity const identity = NQRVZEP20::AtaIdentityFrom(page);
  RequireWhole(identity.fModel);
  RequireWhole(identity.fFormFactor);
  NQRVZEP20::TCharacteristics const characteristics = NQRVZEP20::CharacteristicsFrom(page);
  RequireWhole(characteristics.fRotationsPerMinute);
  for (NQRVZEP20::TDesignator const& designator : NQRVZEP20::DesignatorsFrom(page))
    Require(!designator.fText.empty() && designator.fText.size() <= 2 * size);
  return 0;
}
