// SPDX-License-Identifier: Apache-2.0

// Reads any text as the output of smartctl. Each property of the records must have a value or a reason.

#include "fuzz/Require.h"
#include "providers/storage/Health.h"

namespace {

void RequireWhole(NQRVZEP20::TRecord const& record) {
  for (NQRVZEP20::TRecordProperty const& property : record.GetProperties())
    Require(!property.fValue.IsNull() || (!property.fMissing.fCode.empty() && !property.fMissing.fReason.empty()));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  NQRVZEP20::TSmartReport const report = NQRVZEP20::SmartReportFrom({reinterpret_cast<char const*>(data), size});
  RequireWhole(NQRVZEP20::HealthRecord("sda", report));
  for (NQRVZEP20::TSmartAttribute const& attribute : report.fAttributes)
    RequireWhole(NQRVZEP20::AttributeRecord("sda", attribute));
  return 0;
}
