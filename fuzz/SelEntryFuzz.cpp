// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as an entry of the event log, and writes it in words.

#include "fuzz/Require.h"
#include "providers/controller/EventWords.h"
#include "providers/controller/SelEntry.h"

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  using namespace NQRVZEP20;
  auto const entry = SelEntryFrom({reinterpret_cast<char const*>(data), size});
  Require(entry.has_value() == (size >= kSelEntryLength));
  if (!entry) return 0;
  TSdrSensor sensor;
  sensor.fScale = {0, 0, 1, 0, 0, 0};
  Require(!EventText(*entry, &sensor).empty() && !EventText(*entry, nullptr).empty());
  EEventSeverity const severity = SeverityOf(*entry);
  Require(!entry->fIsDeasserted || severity == EEventSeverity::kInformation);
  Require(!entry->fIsDeasserted || entry->fKind == TSelEntry::EKind::kEvent);
  SelTimeFrom(entry->fTime);
  return 0;
}
