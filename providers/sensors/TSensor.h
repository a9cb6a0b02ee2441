// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"
#include "providers/reasons/TMachineFiles.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A sensor of the kernel's hwmon interface (/sys/class/hwmon).
struct TSensor {
  enum class EKind { kTemperature, kFan, kVoltage, kCurrent, kPower, kHumidity };

  // A threshold, or none: chips report 0, and values far outside of what they can measure, for a threshold that is not set.
  using TThreshold = TFinding<std::int32_t>;

  std::string fChip = {};  // the name of the driver, and the device: "coretemp coretemp.0", "nvme 0000:01:00.0"
  std::string fName = {};  // the name of its files: "temp1"
  std::string fPath = {};  // of its files, without the ending: "/sys/class/hwmon/hwmon0/temp1"
  EKind fKind = EKind::kTemperature;
  TFinding<std::string> fLabel = TMissing{};  // "Core 0"
  TFinding<std::int32_t> fReading =
      TMissing{};  // in thousandths of the unit (degrees Celsius, volts, amperes, watts, percent); fans in rpm
  // Thresholds, in the unit of the reading.
  TThreshold fLowerCritical = TMissing{}, fLowerNonCritical = TMissing{}, fUpperNonCritical = TMissing{},
             fUpperCritical = TMissing{}, fUpperFatal = TMissing{};
  bool fIsFaulty = false;  // the chip reports that the sensor or the fan is broken
};

// Every sensor, sorted by chip and name. A file that vanishes meanwhile makes its value missing.
std::vector<TSensor> ReadSensors(TMachineFiles const& files);

// The state of the sensor in the words of the DMTF schema: "Normal", "Upper Critical", …, or "Fault". Missing without a reading.
TFinding<std::string> StateOf(TSensor const& sensor);

}  // namespace NQRVZEP20
