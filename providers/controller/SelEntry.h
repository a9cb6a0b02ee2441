// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

constexpr std::size_t kSelEntryLength = 16;

// An entry of the controller's system event log (SEL).
struct TSelEntry {
  enum class EKind { kEvent, kMaker, kMakerWithoutTime };  // an event of a sensor, or an entry in a form of the maker

  std::uint16_t fId = 0;
  EKind fKind = EKind::kEvent;
  std::uint8_t fRecordType = 0;
  std::uint32_t fTime = 0;  // as the controller reports it; see SelTimeFrom

  // Only of an event:
  std::uint8_t fOwner = 0, fLun = 0, fSensorType = 0, fSensorNumber = 0, fEventType = 0;  // LUN: of the owner
  bool fIsDeasserted = false;                                                             // the state has ended
  std::uint8_t fData[3] = {};

  std::string fBytes;  // all 16
};

// Nothing if there are not 16 bytes.
std::optional<TSelEntry> SelEntryFrom(std::string_view bytes);

// A time of the log. Controllers count from their own start until their clock is set.
struct TSelTime {
  enum class EKind { kUnknown, kSinceStart, kDate };
  EKind fKind;
  std::uint32_t fSeconds;  // since 1970, or since the start of the controller
};
TSelTime SelTimeFrom(std::uint32_t time);

}  // namespace NQRVZEP20
