// SPDX-License-Identifier: Apache-2.0

// zep remote --inventory, compared with ipmitool value by value, on a simulated controller with sensors and events.

#include "tests/system/ipmi/InventoryBed.h"

#include <gmock/gmock.h>

#include <cmath>
#include <sstream>

namespace NQRVZEP20 {
namespace {

using nlohmann::json;
using testing::HasSubstr;
using testing::Not;

double NumberOf(json const& sensor, char const* property) {
  json const& value = sensor[property]["value"];
  return value.is_null() ? NAN : value.get<double>() * std::pow(10, sensor["UnitModifier"]["value"].get<int>());
}

TEST_F(InventoryTest, SensorsAgreeWithIpmitool) {
  // Columns of "ipmitool sensor": name, reading, unit, state, and the thresholds from the lowest to the highest.
  constexpr char const* thresholds[] = {"LowerThresholdFatal",       "LowerThresholdCritical", "LowerThresholdNonCritical",
                                        "UpperThresholdNonCritical", "UpperThresholdCritical", "UpperThresholdFatal"};
  std::map<std::string, std::string> const states = {{"cr", "Upper Critical"}, {"ok", "Normal"}, {"nr", "Upper Fatal"}};
  std::map<std::string, int> const units = {{"degrees C", 2}, {"Volts", 5}, {"RPM", 19}};
  json const document = Inventory();
  std::size_t compared = 0;
  for (TCells const& row : RowsOf(Ipmitool("sensor"), '|')) {
    SCOPED_TRACE(row.at(0));
    if (row.at(2) == "discrete") {
      std::string const state = Instance(document, "CIM_Sensor", "ElementName", row.at(0))["CurrentState"]["value"];
      EXPECT_EQ(state, row.at(1) == "0x3" ? "Presence detected, Power Supply Failure detected" : "Presence detected");
      ++compared;
      continue;
    }
    json const& sensor = Instance(document, "CIM_NumericSensor", "ElementName", row.at(0));
    EXPECT_DOUBLE_EQ(NumberOf(sensor, "CurrentReading"), std::stod(row.at(1)));
    EXPECT_EQ(sensor["BaseUnits"]["value"], units.at(row.at(2)));
    EXPECT_EQ(sensor["CurrentState"]["value"], states.at(row.at(3)));
    for (std::size_t i = 0; i < 6; ++i) {
      double const value = NumberOf(sensor, thresholds[i]);
      if (row.at(4 + i) == "na") {
        EXPECT_TRUE(std::isnan(value)) << thresholds[i];
      } else {
        EXPECT_DOUBLE_EQ(value, std::stod(row.at(4 + i))) << thresholds[i];
      }
    }
    ++compared;
  }
  EXPECT_EQ(compared, 6U);
}

TEST_F(InventoryTest, EventsAgreeWithIpmitool) {
  Ipmitool("raw 0x0a 0x49 0x80 0x44 0x17 0x60");  // Set SEL Time: 1 February 2021
  Ipmitool("raw 0x0a 0x44 0 0 2 0 0 0 0 0x20 0 4 8 0x51 0x6f 1 0xff 0xff");
  json const document = Inventory();
  auto const rows = RowsOf(Ipmitool("sel elist"), '|');
  ASSERT_EQ(rows.size(), 6U);
  for (TCells const& row : rows) {
    SCOPED_TRACE(row.at(0));
    json const& entry = Instance(document, "ZEP_EventLogEntry", "RecordID", std::to_string(std::stoi(row.at(0), nullptr, 16)));
    std::string const time = entry["MessageTimestamp"]["value"], text = entry["RecordData"]["value"];
    EXPECT_EQ(row.at(1) == "Pre-Init", time.find(':') != std::string::npos) << "an interval";
    if (row.at(1) != "Pre-Init") {
      EXPECT_EQ(time.substr(0, 12), "202102010000");
    }
    std::string const name = entry["ElementName"]["value"], type = entry["SensorTypeName"]["value"];
    std::string const sensor = name == "sensor 0x99" ? "#0x99" : name;
    EXPECT_EQ(row.at(3), type + " " + sensor);
    EXPECT_THAT(text, HasSubstr(row.at(5) == "Asserted" ? ", asserted" : ", deasserted"));
    std::string words = row.at(4);  // "Upper Critical going high", where we have "Upper Critical - going high"
    if (words.find(" going") != std::string::npos) words.insert(words.find(" going"), " -");
    EXPECT_THAT(text, HasSubstr(words));
  }
}

// `output` has a line "label : value".
void ExpectLine(std::string const& output, std::string const& label, std::string const& value) {
  std::string found = "no such line";
  for (TCells const& row : RowsOf(output, ':')) {
    if (row.empty() || row[0] != label) continue;
    found = "";
    for (std::size_t i = 1; i < row.size(); ++i) found += (i > 1 ? ":" : "") + row[i];
  }
  EXPECT_EQ(found, value) << label;
}

TEST_F(InventoryTest, TheOtherPartsAgreeWithIpmitool) {
  json const document = Inventory();
  std::string const mc = Ipmitool("mc info"), fru = Ipmitool("fru print 0");
  json const& controller = Instance(document, "ZEP_ManagementController", "ElementName", "management controller");
  ExpectLine(mc, "Firmware Revision", controller["FirmwareVersion"]["value"]);
  ExpectLine(mc, "IPMI Version", controller["IPMIVersion"]["value"]);
  ExpectLine(mc, "Manufacturer ID", std::to_string(controller["ManufacturerID"]["value"].get<int>()));
  char product[32];
  unsigned const number = controller["ProductID"]["value"];
  std::snprintf(product, sizeof product, "%u (0x%04x)", number, number);
  ExpectLine(mc, "Product ID", product);
  ExpectLine(mc, "Device ID", std::to_string(controller["DeviceNumber"]["value"].get<int>()));

  json const& chassis = Instance(document, "CIM_PhysicalPackage", "ElementName", "FRU 0 chassis");
  json const& board = Instance(document, "CIM_PhysicalPackage", "ElementName", "FRU 0 board");
  json const& productArea = Instance(document, "CIM_PhysicalPackage", "ElementName", "FRU 0 product");
  ExpectLine(fru, "Chassis Part Number", chassis["PartNumber"]["value"]);
  ExpectLine(fru, "Chassis Serial", chassis["SerialNumber"]["value"]);
  ExpectLine(fru, "Chassis Extra", chassis["OtherIdentifyingInfo"]["value"]);
  ExpectLine(fru, "Board Mfg", board["Manufacturer"]["value"]);
  ExpectLine(fru, "Board Product", board["Model"]["value"]);
  ExpectLine(fru, "Board Serial", board["SerialNumber"]["value"]);
  ExpectLine(fru, "Board Part Number", board["PartNumber"]["value"]);
  ExpectLine(fru, "Product Manufacturer", productArea["Manufacturer"]["value"]);
  ExpectLine(fru, "Product Name", productArea["Model"]["value"]);
  ExpectLine(fru, "Product Part Number", productArea["PartNumber"]["value"]);
  ExpectLine(fru, "Product Version", productArea["Version"]["value"]);
  ExpectLine(fru, "Product Serial", productArea["SerialNumber"]["value"]);
  ExpectLine(fru, "Product Asset Tag", productArea["UserTracking"]["value"]);
}

TEST_F(InventoryTest, TheNetworkAgreesWithIpmitool) {
  json const document = Inventory();
  std::string const lan = Ipmitool("lan print 1");
  json const& channel = Instance(document, "ZEP_ControllerNetwork", "ElementName", "channel 1");
  EXPECT_EQ(channel["AddressSource"]["value"], "static");
  ExpectLine(lan, "IP Address Source", "Static Address");
  EXPECT_EQ(channel["IPv4Address"]["value"], "192.0.2.7") << "the simulator has the parameters";
  ExpectLine(lan, "IP Address", channel["IPv4Address"]["value"]);
  ExpectLine(lan, "Subnet Mask", channel["SubnetMask"]["value"]);
  ExpectLine(lan, "MAC Address", channel["MACAddress"]["value"]);
  ExpectLine(lan, "Default Gateway IP", channel["DefaultGateway"]["value"]);
  ExpectLine(lan, "802.1q VLAN ID", channel["VLANID"]["value"].is_null() ? "Disabled" : channel["VLANID"]["value"].dump());
}

TEST_F(InventoryTest, TheAccountsAgreeWithIpmitool) {
  json const document = Inventory();
  std::map<json, std::string> const states = {{nullptr, "unknown"}, {2, "enabled"}, {3, "disabled"}};
  std::map<std::string, int> const accounts = {{"zepadmin", 2}, {"zepuser", 3}, {"zepoff", 4}, {"zep16", 5}};
  for (auto const& [name, number] : accounts) {
    SCOPED_TRACE(name);
    std::string const access = Ipmitool("channel getaccess 1 " + std::to_string(number));
    json const& account = Instance(document, "ZEP_ControllerAccount", "UserID", name);
    ExpectLine(access, "User Name", name);
    ExpectLine(access, "Enable Status", states.at(account["EnabledState"]["value"]));
    ExpectLine(access, "IPMI Messaging", account["HasLANAccess"]["value"] == true ? "enabled" : "disabled");
    std::string privilege = account["Privilege"]["value"];
    for (char& letter : privilege) letter = static_cast<char>(std::toupper(letter));
    ExpectLine(access, "Privilege Level", privilege);
  }
}

TEST_F(InventoryTest, FindingsAndTablesArePrinted) {
  zep::TRun const run = Run({"127.0.0.1", "--inventory"});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fErrors, "");
  for (char const* text : {"Serial number    KQ12345\n", "the sensor CPU Temp is beyond a threshold (Upper Critical).",
                           "failure of PSU 1", "the clock of the management controller is not set.", "4500 RPM", "12 Volts",
                           "+12V: Upper Critical - going high,", "Server Q100", "zepadmin"})
    EXPECT_THAT(run.fOutput, HasSubstr(text));
  EXPECT_THAT(run.fOutput, Not(HasSubstr("zeppass1")));
  Ipmitool("raw 0x0a 0x49 0x80 0x44 0x17 0x60");  // Set SEL Time: 1 February 2021
  Ipmitool("raw 0x0a 0x44 0 0 2 0 0 0 0 0x20 0 4 8 0x51 0x6f 1 0xff 0xff");
  std::string const dated = Run({"127.0.0.1", "--inventory"}).fOutput;
  EXPECT_THAT(dated, Not(HasSubstr("clock of the management controller")));
  EXPECT_THAT(dated, HasSubstr("2021-02-01 00:00:"));
}

TEST_F(InventoryTest, ThresholdsAreThoseOfTheSettings) {
  Ipmitool("raw 0x0a 0x49 0x80 0x44 0x17 0x60");  // Set SEL Time: 1 February 2021
  Ipmitool("raw 0x0a 0x44 0 0 2 0 0 0 0 0x20 0 4 8 0x51 0x6f 1 0xff 0xff");
  Ipmitool("raw 0x0a 0x49 0x00 0x57 0x1b 0x60");  // three days later
  auto const findings = [&](std::string const& settings) {
    if (!settings.empty()) WriteFile(fDir.Path("zep.cfg"), settings);
    zep::TCall call{{"remote", "--user", "zepadmin", "127.0.0.1", "--inventory"}, {{"ZEP_BMC_PASSWORD", "zeppass1"}}};
    call.fDirectory = fDir.Path();
    zep::TRun const run = fZep.Run(call);
    EXPECT_EQ(run.fStatus, settings.find("many") == std::string::npos ? 0 : 64) << run.fErrors;
    return run.fOutput + run.fErrors;
  };
  constexpr char const* entry = "asserted (3 days ago)";
  EXPECT_THAT(findings(""), HasSubstr(entry));
  EXPECT_THAT(findings("finding-event-log-days=2\n"), Not(HasSubstr(entry)));
  EXPECT_THAT(findings("finding-event-log-days=many\n"), HasSubstr("finding-event-log-days"));
}

TEST_F(InventoryTest, TheSensorRecordsAreReadFromTheCacheTheSecondTime) {
  EXPECT_EQ(Instance(Inventory(), "CIM_NumericSensor", "ElementName", "CPU Temp")["CurrentReading"]["value"], 91);
  std::string const path = fDir.Path("cache/zep/sdr-127.0.0.1"), name = "4350552054656d70";
  std::string records = ReadFile(path);
  std::size_t const at = records.find(name);
  ASSERT_NE(at, std::string::npos);
  WriteFile(path, records.replace(at, name.size(), "4361636865642031"));  // "Cached 1", which only the file contains
  EXPECT_EQ(Instance(Inventory(), "CIM_NumericSensor", "ElementName", "Cached 1")["CurrentReading"]["value"], 91);
}

// In the cached record of the fan, another unit.
TEST_F(InventoryTest, ReadingsHaveTheirUnits) {
  Inventory();
  std::string const path = fDir.Path("cache/zep/sdr-127.0.0.1"), records = ReadFile(path);
  std::size_t const line = records.rfind('\n', records.find("46616e2031")) + 1;  // "Fan 1"
  auto const readingIn = [&](std::string const& unit) {
    constexpr std::size_t place = 20, digits = 2;  // of the kinds of unit in the record; the unit follows
    WriteFile(path, std::string(records).replace(line + place * digits, unit.size(), unit));
    return Run({"127.0.0.1", "--inventory"}).fOutput;
  };
  EXPECT_THAT(readingIn("0012"), HasSubstr("4500 RPM"));
  EXPECT_THAT(readingIn("1846"), HasSubstr("4500 Bytes Per Second"));
  EXPECT_THAT(readingIn("1855"), HasSubstr("4500 (unit: packets per s)"));
}

TEST_F(InventoryTest, ProgressIsShownOnATerminal) {
  std::string const zep = fZep.Path("bin/zep") + " remote 127.0.0.1 --user zepadmin --inventory";
  std::string const command = "TERM=xterm ZEP_BMC_PASSWORD=zeppass1 XDG_CACHE_HOME=" + fDir.Path("cache") + " script -qec '" +
                              zep + "' " + fDir.Path("screen") + " </dev/null >/dev/null";
  ASSERT_EQ(std::system(command.c_str()), 0);
  std::string const screen = ReadFile(fDir.Path("screen"));
  for (char const* step : {"sensor data records: 1 of 6", "sensors: 6 of 6", "event log entries: 5 of 5"})
    EXPECT_THAT(screen, HasSubstr(std::string("\r\x1b[Kzep: ") + step));
}

TEST_F(InventoryTest, AControllerThatFallsSilentLeavesWhatWasReadInTime) {
  fSimulator.reset();
  TSimulator::TSettings settings = Settings();
  settings.fPort = 6230;
  TSimulator controller(settings);
  controller.WaitUntilReady();
  constexpr int answers = 50;  // then the network loses everything
  TRelay relay(623, 6230,
               [](TRelay::TDatagram& datagram) { return datagram.fPlace < answers ? TRelay::AtOnce() : TRelay::TFate(); });
  auto const start = std::chrono::steady_clock::now();
  zep::TRun const run = Run({"127.0.0.1", "--inventory", "--json", "--timeout", "10"});
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(16)) << "the library would wait for 21 s";
  EXPECT_EQ(run.fStatus, 2);
  json const document = json::parse(run.fOutput);
  EXPECT_THAT(std::string(document["reason"]), HasSubstr("inventory: not read to the end: "));
  EXPECT_EQ(Instance(document, "ZEP_ManagementController", "FirmwareVersion", "1.10")["UnreadParts"]["value"].size(), 3U)
      << "the records of the sensors, the event log, and the FRU data";
}

// It would describe the controller of this machine.
TEST_F(InventoryTest, APlugInOfAnotherVersionIsRefused) {
  std::filesystem::remove(fZep.Path("lib/libController.nsp.so"));
  fZep.Add("libController.nsp.so", OLD_CONTROLLER_PLUGIN);
  zep::TRun const run = Run({"127.0.0.1", "--inventory"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fErrors, HasSubstr("inventory: libController.nsp.so did not use the session; install the version of zep"));
}

TEST_F(InventoryTest, WithoutThePlugInTheReasonIsGiven) {
  std::filesystem::remove(fZep.Path("lib/libController.nsp.so"));
  zep::TRun const run = Run({"127.0.0.1", "--inventory"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fErrors,
              HasSubstr("inventory: libController.nsp.so: it is not installed; install the package libzepcore-ipmi"));
}

}  // namespace
}  // namespace NQRVZEP20
