// SPDX-License-Identifier: Apache-2.0
#include "providers/sensors/TPowerSupply.h"

#include "tests/Support.h"

#include <gmock/gmock.h>

#include <filesystem>

namespace NQRVZEP20 {
namespace {

class TPowerSupplyTest : public testing::Test {
protected:
  void Write(std::string const& supply, std::string const& file, std::string const& text) const {
    std::string const directory = fDir.Path("sys/class/power_supply/" + supply);
    std::filesystem::create_directories(directory);
    WriteFile(directory + "/" + file, text + "\n");
  }
  std::vector<TPowerSupply> Read() const { return ReadPowerSupplies(TMachineFiles(fDir.Path())); }

  TTempDir const fDir;
};

TEST_F(TPowerSupplyTest, ASupplyHasStateAndMaker) {
  Write("PSU1", "type", "Mains");
  Write("PSU1", "online", "0");
  Write("PSU1", "health", "Dead");
  Write("PSU1", "model_name", "P1");
  auto const supplies = Read();
  ASSERT_EQ(supplies.size(), 1u);
  EXPECT_EQ(supplies[0].fName, "PSU1");
  EXPECT_FALSE(*supplies[0].fIsOnline);
  EXPECT_EQ(*supplies[0].fHealth, "Dead");
  EXPECT_EQ(*supplies[0].fModel, "P1");
  EXPECT_FALSE(supplies[0].fSerialNumber);
}

TEST_F(TPowerSupplyTest, BatteriesUsbPortsAndOtherDevicesAreNoSupplies) {
  Write("BAT0", "type", "Battery");
  Write("ucsi-source-psy-1", "type", "USB");
  Write("ucsi-source-psy-1", "scope", "System");
  Write("ucsi-source-psy-1", "online", "0");
  Write("mouse", "type", "Mains");
  Write("mouse", "scope", "Device");
  Write("unknown", "online", "1");
  EXPECT_TRUE(Read().empty());
}

TEST_F(TPowerSupplyTest, AnUninterruptibleSupplyIsOne) {
  Write("ups", "type", "UPS");
  EXPECT_EQ(Read().size(), 1u);
}

}  // namespace
}  // namespace NQRVZEP20
