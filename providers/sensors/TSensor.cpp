// SPDX-License-Identifier: Apache-2.0
#include "TSensor.h"

#include <algorithm>
#include <limits>
#include <map>
#include <set>

namespace NQRVZEP20 {

namespace {

using EKind = TSensor::EKind;

std::string const kClass = "/sys/class/hwmon/";

struct TKindOfFile {
  char const* fPrefix;  // of the names of its files
  EKind fKind;
  int fDivisor;           // from the unit of the kernel to that of TSensor
  std::int64_t fHighest;  // beyond it a threshold is not set
};
constexpr TKindOfFile kKinds[] = {{"temp", EKind::kTemperature, 1, 200000},  {"fan", EKind::kFan, 1, 100000},
                                  {"in", EKind::kVoltage, 1, 1000000},       {"curr", EKind::kCurrent, 1, 1000000},
                                  {"power", EKind::kPower, 1000, 100000000}, {"humidity", EKind::kHumidity, 1, 100000}};

// The kind of the files "temp1_…"; null for other names, such as "temp_reset_history".
TKindOfFile const* KindOf(std::string const& sensor) {
  std::size_t const digits = sensor.find_first_of("0123456789");
  if (digits == std::string::npos || sensor.find_first_not_of("0123456789", digits) != std::string::npos) return nullptr;
  for (TKindOfFile const& kind : kKinds)
    if (sensor.compare(0, digits, kind.fPrefix) == 0) return &kind;
  return nullptr;
}

TFinding<std::int32_t> Scaled(std::int64_t number, TKindOfFile const& kind, std::string const& path) {
  std::int64_t const scaled = number / kind.fDivisor;
  if (scaled >= std::numeric_limits<std::int32_t>::min() && scaled <= std::numeric_limits<std::int32_t>::max())
    return static_cast<std::int32_t>(scaled);
  return TMissing{kMissingUnexpected, path + " contains " + std::to_string(number) + ", which no such sensor can measure"};
}

// The files of one sensor. `names`: of all files of the chip, so that missing ones need not be opened.
class TSensorFiles {
public:
  TSensorFiles(TMachineFiles const& files, std::set<std::string> const& names, std::string const& directory,
               std::string const& name, TKindOfFile const& kind)
      : fFiles(files), fNames(names), fDirectory(directory), fName(name), fKind(kind) {}

  TFinding<std::int32_t> Reading() const {
    auto const reading = Number("_input");
    if (reading && IsOfNoThermistor(*reading))
      return TMissing{kMissingPlaceholder,
                      Path("_input") + " contains " + std::to_string(*reading) + ", as if nothing is connected"};
    return reading || fKind.fKind != EKind::kPower ? reading : Number("_average");  // some meters have only an average
  }

  TSensor::TThreshold Threshold(char const* ending) const {
    auto const threshold = Number(ending);
    if (!threshold || (*threshold != 0 && *threshold >= -fKind.fHighest && *threshold <= fKind.fHighest)) return threshold;
    return TMissing{kMissingPlaceholder, Path(ending) + " contains " + std::to_string(*threshold) + ": no threshold is set"};
  }

  TFinding<std::string> Label() const {
    return Has("_label") ? fFiles.Line(Path("_label")) : TFinding<std::string>(None("_label"));
  }

  bool IsFaulty() const {
    if (!Has("_fault")) return false;
    auto const fault = fFiles.Number<int>(Path("_fault"));
    return fault && *fault != 0;
  }

private:
  // The ends of the range of eight bits, in millidegrees.
  bool IsOfNoThermistor(std::int32_t reading) const {
    return fKind.fKind == EKind::kTemperature && (reading == 127000 || reading == -128000);
  }

  std::string Path(char const* ending) const { return fDirectory + fName + ending; }
  bool Has(char const* ending) const { return fNames.count(fName + ending) != 0; }
  TMissing None(char const* ending) const { return {kMissingNotGiven, Path(ending) + " does not exist"}; }

  TFinding<std::int32_t> Number(char const* ending) const {
    if (!Has(ending)) return None(ending);
    std::string const path = Path(ending);
    return fFiles.Number<std::int64_t>(path).Then([&](std::int64_t number) { return Scaled(number, fKind, path); });
  }

  TMachineFiles const& fFiles;
  std::set<std::string> const& fNames;
  std::string const &fDirectory, &fName;
  TKindOfFile const& fKind;
};

// A processor at full load may reach its "temp*_max": from there on, its cooling should run at full power.
bool HasMaximumOfCooling(std::string const& chip) { return chip.rfind("coretemp ", 0) == 0; }

TSensor SensorOf(TSensorFiles const& sensor, std::string const& chip, std::string const& path, std::string const& name,
                 TKindOfFile const& kind) {
  bool const isPower = kind.fKind == EKind::kPower;  // "power1_cap" is the limit that the chip itself keeps
  auto lower = sensor.Threshold("_min"), upper = sensor.Threshold(isPower ? "_cap" : "_max");
  if (upper && HasMaximumOfCooling(chip))
    upper = TMissing{kMissingNotApplicable, path + "_max is where the fans should be at full speed, and not a threshold"};
  if (lower && upper && *lower >= *upper)  // some chips begin with the same value in both
    lower = upper = TMissing{kMissingPlaceholder, path + "_min is not below the upper threshold: neither is set"};
  return {chip,
          name,
          path,
          kind.fKind,
          sensor.Label(),
          sensor.Reading(),
          sensor.Threshold("_lcrit"),
          lower,
          upper,
          sensor.Threshold("_crit"),
          sensor.Threshold("_emergency"),
          sensor.IsFaulty()};
}

// The name of the driver and the device, which stay the same when hwmon numbers change. A chip without a device, such as a
// thermal zone, has the name of its directory.
std::string ChipName(TMachineFiles const& files, std::string const& directory, std::string const& entry) {
  auto const name = files.Line(directory + "name"), device = files.RealName(directory + "device");
  return (name ? *name : entry) + " " + (device ? *device : entry);
}

// The names of the sensors of a chip, each once: "temp1".
std::vector<std::string> SensorNames(std::vector<std::string> const& files) {
  std::vector<std::string> names;
  for (std::string const& file : files) {
    std::string const name = file.substr(0, file.find('_'));
    bool const isReading = file == name + "_input" || file == name + "_average";
    if (isReading && std::find(names.begin(), names.end(), name) == names.end()) names.push_back(name);
  }
  return names;
}

}  // namespace

std::vector<TSensor> ReadSensors(TMachineFiles const& files) {
  std::vector<TSensor> sensors;
  std::map<std::string, int> counts;  // of chips, by name
  for (std::string const& entry : files.Names(kClass)) {
    std::string const directory = kClass + entry + "/";
    std::string chip = ChipName(files, directory, entry);
    if (int const number = ++counts[chip]; number > 1) chip += " #" + std::to_string(number);
    auto const fileNames = files.Names(directory);
    std::set<std::string> const names(fileNames.begin(), fileNames.end());
    for (std::string const& name : SensorNames(fileNames))
      if (TKindOfFile const* const kind = KindOf(name))
        sensors.push_back(SensorOf(TSensorFiles(files, names, directory, name, *kind), chip, directory + name, name, *kind));
  }
  std::stable_sort(sensors.begin(), sensors.end(),
                   [](TSensor const& one, TSensor const& other) { return one.fChip < other.fChip; });
  return sensors;
}

TFinding<std::string> StateOf(TSensor const& sensor) {
  if (sensor.fIsFaulty) return std::string("Fault");
  return sensor.fReading.Then([&](std::int32_t reading) -> std::string {
    auto const isAbove = [&](TSensor::TThreshold const& threshold) { return threshold && reading >= *threshold; };
    auto const isBelow = [&](TSensor::TThreshold const& threshold) { return threshold && reading <= *threshold; };
    if (isAbove(sensor.fUpperFatal)) return "Upper Fatal";
    if (isAbove(sensor.fUpperCritical)) return "Upper Critical";
    if (isBelow(sensor.fLowerCritical)) return "Lower Critical";
    if (isAbove(sensor.fUpperNonCritical)) return "Upper Non-Critical";
    if (isBelow(sensor.fLowerNonCritical)) return "Lower Non-Critical";
    return "Normal";
  });
}

}  // namespace NQRVZEP20
