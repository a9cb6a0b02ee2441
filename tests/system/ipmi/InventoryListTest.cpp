// SPDX-License-Identifier: Apache-2.0

// zep remote --inventory with a list of hosts.

#include "tests/system/ipmi/InventoryBed.h"

#include <list>
#include <set>

namespace NQRVZEP20 {
namespace {

using nlohmann::json;

class InventoryListTest : public InventoryTest {};

TEST_F(InventoryListTest, AListOfHostsHasOneDocumentEach) {
  TSimulator::TSettings settings = Settings();
  settings.fAddress = "127.0.0.2";
  TSimulator other(settings);
  other.WaitUntilReady();
  WriteFile(fDir.Path("hosts"), "127.0.0.1\n127.0.0.2\n");
  zep::TRun const run = Run({"--hosts", fDir.Path("hosts"), "--inventory"});
  EXPECT_EQ(run.fStatus, 0);
  std::size_t documents = 0;
  for (std::string const& line : zep::LinesOf(run.fOutput)) {
    EXPECT_EQ(Instance(json::parse(line), "CIM_NumericSensor", "ElementName", "Fan 1")["CurrentReading"]["value"], 4500);
    ++documents;
  }
  EXPECT_EQ(documents, 2U);
}

// Two reports at once would cancel each other's reservation of the sensor data records of a controller, so that each controller
// is read once before: then its records are cached. Some hosts cannot be reached, and one refuses the account.
TEST_F(InventoryListTest, ManyHostsAreReadInParallelAlthoughSomeFail) {
  fSimulator.reset();
  ASSERT_EQ(std::system("ip route add unreachable 198.51.100.0/24"), 0);
  constexpr int controllers = 12, times = 10;
  std::list<TSimulator> simulators;
  TSimulator::TSettings settings = Settings();
  std::string once;
  for (int n = 1; n <= controllers; ++n) {
    settings.fAddress = "127.1.0." + std::to_string(n);
    once += settings.fAddress + "\n";
    simulators.emplace_back(settings);
  }
  settings.fAddress = "127.2.0.1";
  settings.fPassword = "another";
  simulators.emplace_back(settings);
  for (TSimulator& simulator : simulators) simulator.WaitUntilReady();
  WriteFile(fDir.Path("hosts"), once);
  EXPECT_EQ(Run({"--hosts", fDir.Path("hosts"), "--inventory"}).fStatus, 0);

  std::string many;
  for (int n = 1; n <= times; ++n) many += once + "198.51.100." + std::to_string(n) + "\n";
  WriteFile(fDir.Path("hosts"), many + "127.2.0.1\n");
  zep::TRun const run = Run({"--hosts", fDir.Path("hosts"), "--parallel", "40", "--inventory"});
  EXPECT_EQ(run.fStatus, 2);
  std::multiset<std::string> read, failed;
  for (std::string const& line : zep::LinesOf(run.fOutput)) {
    json const document = json::parse(line);
    if (document.contains("error")) {
      failed.insert(document["host"]);
      continue;
    }
    read.insert(document["host"]);
    EXPECT_EQ(Instance(document, "CIM_NumericSensor", "ElementName", "CPU Temp")["CurrentReading"]["value"], 91);
  }
  EXPECT_EQ(failed.size(), times + 1U);
  for (std::string const& host : failed) EXPECT_TRUE(host.rfind("198.51.100.", 0) == 0 || host == "127.2.0.1") << host;
  for (std::string const& host : zep::LinesOf(once)) EXPECT_EQ(read.count(host), std::size_t(times)) << host;
}

}  // namespace
}  // namespace NQRVZEP20
