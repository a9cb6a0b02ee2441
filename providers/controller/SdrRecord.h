// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The conversion of raw readings to the unit of the sensor.
struct TSensorScale {
  std::uint8_t fForm = 3;  // of the raw byte: 0 unsigned, 1 and 2 signed; 3: the sensor has no number
  std::uint8_t fLinearization = 0;
  std::int16_t fM = 0, fB = 0;
  std::int8_t fResultExponent = 0, fBExponent = 0;

  bool HasNumber() const { return fForm != 3; }
  bool IsWhole() const { return fLinearization == 0 && fResultExponent >= 0 && fBExponent + fResultExponent >= 0; }
};

// Raw thresholds and a bit for each that is valid.
struct TRawThresholds {
  enum EPlace { kLowerNonCritical, kLowerCritical, kLowerFatal, kUpperNonCritical, kUpperCritical, kUpperFatal, kCount };

  std::uint8_t fValid = 0;  // bit n: the threshold of EPlace n
  std::uint8_t fRaw[kCount] = {};
};

constexpr std::uint8_t kThisController = 0x20;  // the address of the controller that is read

// The unit of the readings, in the numbers of IPMI.
struct TSensorUnit {
  enum EModifier : std::uint8_t { kNone, kDivided, kMultiplied };

  bool fIsPercentage = false;
  std::uint8_t fBase = 0;               // 0: unspecified
  std::uint8_t fModifier = kNone;       // how the second unit changes the first one
  std::uint8_t fSecond = 0, fRate = 0;  // rate: 0 none, 1 per microsecond, … 6 per day
};

constexpr std::uint8_t kThresholdReading = 1;  // the reading type of sensors with thresholds

// A sensor of the repository of sensor data records (SDR).
struct TSdrSensor {
  enum class EKind { kFull, kCompact, kEventOnly };

  EKind fKind = EKind::kFull;
  std::uint8_t fOwner = 0x20, fLun = 0, fNumber = 0;  // of the controller that has the sensor
  std::uint8_t fType = 0, fReadingType = 0;
  TSensorUnit fUnit = {};
  TSensorScale fScale = {};
  TRawThresholds fThresholds = {};  // as the repository has them
  TFinding<std::string> fName = TMissing{};
  std::uint8_t fSharers = 1;          // sensors that the record describes, with numbers from fNumber on
  bool fHasLetters = false;           // whether their names end in letters and not in numbers
  std::uint8_t fOffset = 0;           // of the first number or letter
  std::uint16_t fReadableStates = 0;  // of a sensor without thresholds: a bit for each state that its reading can have
};

// The sensors that the record of this one describes. If there are several, the name of each ends in a number or letter of its
// own: "DIMM 1", "DIMM 2".
std::vector<TSdrSensor> SharersOf(TSdrSensor const& sensor);

// A FRU device of the repository.
struct TFruLocator {
  bool fIsLogical = false;  // only logical devices are read by commands to the controller
  std::uint8_t fController = 0x20, fLun = 0, fDevice = 0;
  TFinding<std::string> fName = TMissing{};
};

// The content of a record; neither of the two for a record of another kind, and for one that is cut short.
struct TSdrRecord {
  std::optional<TSdrSensor> fSensor;
  std::optional<TFruLocator> fFru;
};

// `record`: all its bytes, with its header.
TSdrRecord SdrRecordFrom(std::string_view record);

}  // namespace NQRVZEP20
