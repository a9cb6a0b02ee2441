// SPDX-License-Identifier: Apache-2.0
#include "SelEntry.h"

#include "TBytes.h"

namespace NQRVZEP20 {

namespace {

constexpr std::uint8_t kFirstOfMaker = 0xC0, kFirstWithoutTime = 0xE0;
constexpr std::uint32_t kUnknownTime = 0xFFFFFFFF, kFirstDate = 0x20000000;

TSelEntry::EKind KindOf(std::uint8_t recordType) {
  if (recordType >= kFirstWithoutTime) return TSelEntry::EKind::kMakerWithoutTime;
  return recordType >= kFirstOfMaker ? TSelEntry::EKind::kMaker : TSelEntry::EKind::kEvent;
}

}  // namespace

std::optional<TSelEntry> SelEntryFrom(std::string_view bytes) {
  if (bytes.size() < kSelEntryLength) return std::nullopt;
  TBytes const record(bytes);
  TSelEntry entry;
  entry.fId = record.Word(0);
  entry.fRecordType = record.At(2);
  entry.fKind = KindOf(entry.fRecordType);
  entry.fTime = entry.fKind == TSelEntry::EKind::kMakerWithoutTime ? kUnknownTime : record.Long(3);
  entry.fBytes = bytes.substr(0, kSelEntryLength);
  if (entry.fKind != TSelEntry::EKind::kEvent) return entry;
  entry.fOwner = record.At(7);
  entry.fLun = record.At(8) & 0x03;
  entry.fSensorType = record.At(10);
  entry.fSensorNumber = record.At(11);
  entry.fEventType = record.At(12) & 0x7F;
  entry.fIsDeasserted = (record.At(12) & 0x80) != 0;
  for (std::size_t i = 0; i < 3; ++i) entry.fData[i] = record.At(13 + i);
  return entry;
}

TSelTime SelTimeFrom(std::uint32_t time) {
  if (time == kUnknownTime) return {TSelTime::EKind::kUnknown, 0};
  return {time < kFirstDate ? TSelTime::EKind::kSinceStart : TSelTime::EKind::kDate, time};
}

}  // namespace NQRVZEP20
