// SPDX-License-Identifier: Apache-2.0
#include "providers/sensors/TSensor.h"

#include "tests/Support.h"

#include <gmock/gmock.h>

#include <filesystem>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;

// A machine whose sensors have the given files.
class TSensorTest : public testing::Test {
protected:
  void Chip(std::string const& hwmon, std::string const& name, std::string const& device = "") {
    Write(hwmon, "name", name);
    if (device.empty()) return;
    std::filesystem::create_directories(fDir.Path("sys/devices/" + device));
    std::filesystem::create_directory_symlink("../../../devices/" + device, fDir.Path("sys/class/hwmon/" + hwmon + "/device"));
  }
  void Write(std::string const& hwmon, std::string const& file, std::string const& text) {
    std::filesystem::create_directories(fDir.Path("sys/class/hwmon/" + hwmon));
    WriteFile(fDir.Path("sys/class/hwmon/" + hwmon + "/" + file), text + "\n");
  }
  std::vector<TSensor> Sensors() const { return ReadSensors(TMachineFiles(fDir.Path())); }
  TSensor Only() const {
    auto const sensors = Sensors();
    EXPECT_EQ(sensors.size(), 1u);
    return sensors.at(0);
  }

  TTempDir const fDir;
};

TEST_F(TSensorTest, ASensorHasItsChipLabelReadingAndThresholds) {
  Chip("hwmon3", "jc42", "0-0018");
  Write("hwmon3", "temp2_label", "DIMM 0");
  Write("hwmon3", "temp2_input", "45000");
  Write("hwmon3", "temp2_max", "84000");
  Write("hwmon3", "temp2_crit", "100000");
  Write("hwmon3", "temp2_crit_alarm", "0");
  TSensor const sensor = Only();
  EXPECT_EQ(sensor.fChip, "jc42 0-0018");
  EXPECT_EQ(sensor.fName, "temp2");
  EXPECT_EQ(*sensor.fLabel, "DIMM 0");
  EXPECT_EQ(*sensor.fReading, 45000);
  EXPECT_EQ(*sensor.fUpperNonCritical, 84000);
  EXPECT_EQ(*sensor.fUpperCritical, 100000);
  EXPECT_EQ(sensor.fUpperFatal.Why().fCode, kMissingNotGiven);
  EXPECT_EQ(*StateOf(sensor), "Normal");
}

TEST_F(TSensorTest, AProcessorMayBeAsWarmAsItsCoolingAllows) {
  Chip("hwmon0", "coretemp", "coretemp.0");
  Chip("hwmon1", "jc42", "0-0018");
  for (char const* const hwmon : {"hwmon0", "hwmon1"}) {
    Write(hwmon, "temp1_input", "90000");
    Write(hwmon, "temp1_max", "84000");
    Write(hwmon, "temp1_crit", "100000");
  }
  auto const sensors = Sensors();
  ASSERT_EQ(sensors.size(), 2u);
  EXPECT_EQ(sensors[0].fUpperNonCritical.Why().fCode, kMissingNotApplicable);
  EXPECT_EQ(*StateOf(sensors[0]), "Normal");
  EXPECT_EQ(*StateOf(sensors[1]), "Upper Non-Critical");
  Write("hwmon0", "temp1_input", "100000");
  EXPECT_EQ(*StateOf(Sensors()[0]), "Upper Critical");
}

TEST_F(TSensorTest, KindsAreKnownByTheNamesOfTheFiles) {
  Chip("hwmon0", "board");
  for (char const* file : {"temp1_input", "fan1_input", "in0_input", "curr1_input", "humidity1_input", "power1_average",
                           "energy1_input", "temp_reset_history", "beep_enable"})
    Write("hwmon0", file, "7000");
  std::vector<std::pair<std::string, int>> kinds;
  for (TSensor const& sensor : Sensors()) kinds.emplace_back(sensor.fName, static_cast<int>(sensor.fKind));
  EXPECT_THAT(kinds, testing::UnorderedElementsAre(std::pair("temp1", 0), std::pair("fan1", 1), std::pair("in0", 2),
                                                   std::pair("curr1", 3), std::pair("power1", 4), std::pair("humidity1", 5)));
  for (TSensor const& sensor : Sensors()) EXPECT_EQ(*sensor.fReading, sensor.fName == "power1" ? 7 : 7000) << sensor.fName;
}

TEST_F(TSensorTest, ChipsOfOneNameStayApart) {
  Chip("hwmon0", "acpitz");
  Chip("hwmon1", "nvme", "0000:01:00.0");
  Chip("hwmon2", "nvme", "0000:02:00.0");
  for (char const* hwmon : {"hwmon0", "hwmon1", "hwmon2"}) Write(hwmon, "temp1_input", "1000");
  std::vector<std::string> chips;
  for (TSensor const& sensor : Sensors()) chips.push_back(sensor.fChip);
  EXPECT_THAT(chips, ElementsAre("acpitz hwmon0", "nvme 0000:01:00.0", "nvme 0000:02:00.0"));
}

TEST_F(TSensorTest, AThresholdOfZeroOrBeyondAllMeasureIsNotSet) {
  Chip("hwmon0", "nvme");
  Write("hwmon0", "temp1_input", "41850");
  Write("hwmon0", "temp1_min", "-273150");
  Write("hwmon0", "temp1_max", "0");
  Write("hwmon0", "temp1_crit", "65261850");
  TSensor const sensor = Only();
  EXPECT_EQ(sensor.fUpperNonCritical.Why().fCode, kMissingPlaceholder);
  EXPECT_THAT(sensor.fUpperCritical.Why().fReason, testing::EndsWith("temp1_crit contains 65261850: no threshold is set"));
  EXPECT_FALSE(sensor.fLowerNonCritical);
  EXPECT_EQ(*StateOf(sensor), "Normal");
}

TEST_F(TSensorTest, AThermistorThatIsNotConnectedHasNoReading) {
  Chip("hwmon0", "board");
  Write("hwmon0", "temp1_input", "-128000");
  Write("hwmon0", "temp2_input", "127000");
  Write("hwmon0", "in1_input", "127000");
  auto const sensors = Sensors();
  ASSERT_EQ(sensors.size(), 3u);
  for (TSensor const& sensor : sensors)
    if (sensor.fKind == TSensor::EKind::kTemperature)
      EXPECT_EQ(sensor.fReading.Why().fCode, kMissingPlaceholder) << sensor.fName;
    else
      EXPECT_EQ(*sensor.fReading, 127000);
}

TEST_F(TSensorTest, EqualLowerAndUpperThresholdsAreNotSet) {
  Chip("hwmon0", "board");
  Write("hwmon0", "temp1_input", "35000");
  Write("hwmon0", "temp1_min", "127000");
  Write("hwmon0", "temp1_max", "127000");
  TSensor const sensor = Only();
  EXPECT_EQ(sensor.fLowerNonCritical.Why().fCode, kMissingPlaceholder);
  EXPECT_EQ(sensor.fUpperNonCritical.Why().fCode, kMissingPlaceholder);
  EXPECT_EQ(*StateOf(sensor), "Normal");
}

TEST_F(TSensorTest, TheWorstStateIsNamed) {
  TSensor sensor;
  auto const stateAt = [&](int reading) {
    sensor.fReading = reading;
    return *StateOf(sensor);
  };
  sensor.fLowerCritical = 10, sensor.fLowerNonCritical = 20;
  sensor.fUpperNonCritical = 70, sensor.fUpperCritical = 80, sensor.fUpperFatal = 90;
  EXPECT_EQ(stateAt(10), "Lower Critical");
  EXPECT_EQ(stateAt(20), "Lower Non-Critical");
  EXPECT_EQ(stateAt(21), "Normal");
  EXPECT_EQ(stateAt(70), "Upper Non-Critical");
  EXPECT_EQ(stateAt(80), "Upper Critical");
  EXPECT_EQ(stateAt(90), "Upper Fatal");
  sensor.fIsFaulty = true;
  EXPECT_EQ(stateAt(21), "Fault");
}

TEST_F(TSensorTest, AReadingThatIsNotANumberOrTooLargeHasAReason) {
  Chip("hwmon0", "board");
  Write("hwmon0", "temp1_input", "hot");
  Write("hwmon0", "temp2_input", "9000000000");
  auto const sensors = Sensors();
  ASSERT_EQ(sensors.size(), 2u);
  for (TSensor const& sensor : sensors) {
    EXPECT_EQ(sensor.fReading.Why().fCode, kMissingUnexpected) << sensor.fName;
    EXPECT_FALSE(StateOf(sensor)) << sensor.fName;
  }
}

TEST_F(TSensorTest, AMachineWithoutSensorsHasNone) { EXPECT_TRUE(Sensors().empty()); }

}  // namespace
}  // namespace NQRVZEP20
