// SPDX-License-Identifier: Apache-2.0
#include "SdrRecord.h"

#include "IpmiText.h"
#include "TBytes.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

enum EType : std::uint8_t { kFull = 0x01, kCompact = 0x02, kEventOnly = 0x03, kFruDevice = 0x11 };

constexpr std::size_t kHeader = 5;

// A number of `bits` bits in two's complement.
int Signed(unsigned value, unsigned bits) {
  int const number = static_cast<int>(value);
  return value >> (bits - 1) != 0 ? number - (1 << bits) : number;
}

TFinding<std::string> NameAt(TBytes const& record, std::size_t offset) {
  std::uint8_t const head = record.At(offset);
  return IpmiText(TextFormOf(head), record.Part(offset + 1, TextLengthOf(head)));
}

// Ten bits: the lower byte, and the upper two bits of the next.
std::int16_t TenBits(TBytes const& record, std::size_t offset) {
  return static_cast<std::int16_t>(Signed(record.At(offset) | (record.At(offset + 1) & 0xC0U) << 2, 10));
}

TSensorScale ScaleOf(TBytes const& record) {
  std::uint8_t const exponents = record.At(29);
  return {static_cast<std::uint8_t>(record.At(20) >> 6),
          static_cast<std::uint8_t>(record.At(23) & 0x7F),
          TenBits(record, 24),
          TenBits(record, 26),
          static_cast<std::int8_t>(Signed(exponents >> 4, 4)),
          static_cast<std::int8_t>(Signed(exponents & 0x0FU, 4))};
}

TSensorUnit UnitOf(TBytes const& record) {
  std::uint8_t const kinds = record.At(20);
  return {(kinds & 1) != 0, record.At(21), static_cast<std::uint8_t>(kinds >> 1 & 3), record.At(22),
          static_cast<std::uint8_t>(kinds >> 3 & 7)};
}

TRawThresholds ThresholdsOf(TBytes const& record) {
  return {static_cast<std::uint8_t>(record.At(18) & 0x3F),
          {record.At(41), record.At(40), record.At(39), record.At(38), record.At(37), record.At(36)}};
}

// The fields that all sensor records share.
TSdrSensor SensorOf(TBytes const& record, TSdrSensor::EKind kind) {
  TSdrSensor sensor;
  sensor.fKind = kind;
  sensor.fOwner = record.At(5);
  sensor.fLun = record.At(6) & 0x03;
  sensor.fNumber = record.At(7);
  std::size_t const types = kind == TSdrSensor::EKind::kEventOnly ? 10 : 12;
  sensor.fType = record.At(types);
  sensor.fReadingType = record.At(types + 1) & 0x7F;
  bool const hasStates = kind != TSdrSensor::EKind::kEventOnly && sensor.fReadingType != kThresholdReading;
  if (hasStates) sensor.fReadableStates = record.Word(18) & 0x7FFF;
  return sensor;
}

// Full records of sensors with states often have zeros instead of the mark for "no number".
bool HasNumber(TSdrSensor const& sensor) {
  return sensor.fReadingType == kThresholdReading || sensor.fUnit.fIsPercentage || sensor.fUnit.fBase != 0;
}

TSdrSensor FullSensor(TBytes const& record) {
  TSdrSensor sensor = SensorOf(record, TSdrSensor::EKind::kFull);
  sensor.fUnit = UnitOf(record);
  if (HasNumber(sensor)) sensor.fScale = ScaleOf(record);
  if (sensor.fReadingType == kThresholdReading) sensor.fThresholds = ThresholdsOf(record);
  sensor.fName = NameAt(record, 47);
  return sensor;
}

TSdrSensor OtherSensor(TBytes const& record, TSdrSensor::EKind kind, std::size_t sharingOffset, std::size_t nameOffset) {
  TSdrSensor sensor = SensorOf(record, kind);
  sensor.fName = NameAt(record, nameOffset);
  sensor.fSharers = std::max<std::uint8_t>(record.At(sharingOffset) & 0x0F, 1);
  sensor.fHasLetters = (record.At(sharingOffset) & 0x30) == 0x10;
  sensor.fOffset = record.At(sharingOffset + 1) & 0x7F;
  return sensor;
}

// 0 is "A", 25 is "Z", 26 is "AA".
std::string LettersOf(unsigned number) {
  std::string letters(1, static_cast<char>('A' + number % 26));
  return number < 26 ? letters : LettersOf(number / 26 - 1) + letters;
}

TFruLocator FruLocatorOf(TBytes const& record) {
  std::uint8_t const access = record.At(7);
  return {(access & 0x80) != 0, record.At(5), static_cast<std::uint8_t>(access >> 3 & 0x03), record.At(6), NameAt(record, 15)};
}

bool IsAtLeast(TBytes const& record, std::size_t length) { return record.Size() >= length; }

}  // namespace

TSdrRecord SdrRecordFrom(std::string_view record) {
  TBytes const bytes(record.substr(0, kHeader + TBytes(record).At(4)));
  switch (bytes.At(3)) {
    case kFull:
      if (IsAtLeast(bytes, 48)) return {FullSensor(bytes), {}};
      break;
    case kCompact:
      if (IsAtLeast(bytes, 32)) return {OtherSensor(bytes, TSdrSensor::EKind::kCompact, 23, 31), {}};
      break;
    case kEventOnly:
      if (IsAtLeast(bytes, 17)) return {OtherSensor(bytes, TSdrSensor::EKind::kEventOnly, 12, 16), {}};
      break;
    case kFruDevice:
      if (IsAtLeast(bytes, 16)) return {{}, FruLocatorOf(bytes)};
      break;
    default:
      break;
  }
  return {};
}

std::vector<TSdrSensor> SharersOf(TSdrSensor const& sensor) {
  constexpr unsigned last = 0xFE;  // 0xFF is not the number of a sensor
  if (sensor.fSharers == 1) return {sensor};
  std::vector<TSdrSensor> sharers;
  for (unsigned i = 0; i < sensor.fSharers && sensor.fNumber + i <= last; ++i) {
    TSdrSensor& sharer = sharers.emplace_back(sensor);
    sharer.fNumber = static_cast<std::uint8_t>(sensor.fNumber + i);
    unsigned const place = sensor.fOffset + i;
    if (sensor.fName) sharer.fName = *sensor.fName + " " + (sensor.fHasLetters ? LettersOf(place) : std::to_string(place));
  }
  return sharers;
}

}  // namespace NQRVZEP20
