// SPDX-License-Identifier: Apache-2.0

// zep remote --inventory, compared with ipmitool value by value, on a simulated controller with sensors and events.

#include "tests/providers/controller/ControllerBytes.h"
#include "tests/system/ipmi/IpmiBed.h"
#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <sstream>

namespace NQRVZEP20 {
namespace {

using nlohmann::json;
using testing::HasSubstr;
using testing::Not;

using TCells = std::vector<std::string>;

std::string Trimmed(std::string const& text) {
  std::size_t const begin = text.find_first_not_of(' ');
  return begin == std::string::npos ? "" : text.substr(begin, text.find_last_not_of(' ') + 1 - begin);
}

// The lines of a table, split at `separator`.
std::vector<TCells> RowsOf(std::string const& text, char separator) {
  std::vector<TCells> rows;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    std::istringstream cells(line);
    rows.emplace_back();
    for (std::string cell; std::getline(cells, cell, separator);) rows.back().push_back(Trimmed(cell));
  }
  return rows;
}

class InventoryTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(HasIpmiBed(), kIpmiBedNeeds);
    NEEDS(std::system("command -v ipmitool >/dev/null") == 0, "ipmitool");
    EnterNetworkNamespace();
    for (char const* library : {"libipmiClient.so", "libController.nsp.so"})
      fZep.Add(library, TEST_LIB_DIR "/" + std::string(library));
    TSimulator::TSettings settings;
    settings.fFru = FruImage();
    settings.fMore = SourcePath("tests/system/ipmi/sim/sensors.emu");
    fSimulator.emplace(settings);
    fSimulator->WaitUntilReady();
  }

  // Three areas, and the identity at its place after them.
  std::string FruImage() const {
    std::string image = FruDevice();
    image.resize(1024, '\xFF');
    image.replace(0x1AC, 8, "1234AB7\0"s);
    image.replace(0x1CC, 8, "KQ12345\0"s);
    WriteFile(fDir.Path("fru"), image);
    return fDir.Path("fru");
  }

  zep::TRun Run(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), {"remote", "--user", "zepadmin"});
    return fZep.Run({arguments, {{"ZEP_BMC_PASSWORD", "zeppass1"}, {"XDG_CACHE_HOME", fDir.Path("cache")}}});
  }

  json Inventory() {
    zep::TRun const run = Run({"127.0.0.1", "--inventory", "--json"});
    EXPECT_EQ(run.fStatus, 0) << run.fErrors;
    zep::ExpectEnvelope(run.fOutput, 0, "zep remote");
    return json::parse(run.fOutput);
  }

  static json const& Instance(json const& document, std::string const& className, std::string const& property,
                              std::string const& value) {
    static json const none;
    for (json const& instance : document["instances"])
      if (instance["class"] == className && instance["properties"][property]["value"] == value) return instance["properties"];
    ADD_FAILURE() << "no " << className << " with " << property << " " << value;
    return none;
  }

  // The output of ipmitool, which gets the password from its environment.
  std::string Ipmitool(std::string const& command) const {
    std::string const file = fDir.Path("ipmitool");
    std::string const line =
        "IPMI_PASSWORD=zeppass1 ipmitool -I lanplus -C 3 -H 127.0.0.1 -U zepadmin -E " + command + " >" + file + " 2>/dev/null";
    EXPECT_EQ(std::system(line.c_str()), 0) << command;
    return ReadFile(file);
  }

  TTempDir const fDir;
  zep::TInstallation fZep;
  std::optional<TSimulator> fSimulator;
};

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
  EXPECT_THAT(document.dump(), HasSubstr("Critical"));
}

TEST_F(InventoryTest, TheOtherPartsAgreeWithIpmitool) {
  json const document = Inventory();
  std::string const mc = Ipmitool("mc info"), fru = Ipmitool("fru print 0"), lan = Ipmitool("lan print 1"),
                    users = Ipmitool("user list 1");
  json const& controller = Instance(document, "ZEP_ManagementController", "ElementName", "management controller");
  auto const expectLine = [](std::string const& output, std::string const& label, std::string const& value) {
    std::string found = "no such line";
    for (TCells const& row : RowsOf(output, ':'))
      if (row.at(0) == label) found = row.size() > 1 ? row[1] : "";
    EXPECT_EQ(found, value) << label;
  };
  expectLine(mc, "Firmware Revision", controller["FirmwareVersion"]["value"]);
  expectLine(mc, "IPMI Version", controller["IPMIVersion"]["value"]);
  expectLine(mc, "Manufacturer ID", std::to_string(controller["ManufacturerID"]["value"].get<int>()));
  expectLine(mc, "Device ID", std::to_string(controller["DeviceNumber"]["value"].get<int>()));

  json const& chassis = Instance(document, "CIM_PhysicalPackage", "ElementName", "FRU 0 chassis");
  json const& board = Instance(document, "CIM_PhysicalPackage", "ElementName", "FRU 0 board");
  json const& product = Instance(document, "CIM_PhysicalPackage", "ElementName", "FRU 0 product");
  expectLine(fru, "Chassis Part Number", chassis["PartNumber"]["value"]);
  expectLine(fru, "Chassis Serial", chassis["SerialNumber"]["value"]);
  expectLine(fru, "Chassis Extra", chassis["OtherIdentifyingInfo"]["value"]);
  expectLine(fru, "Board Mfg", board["Manufacturer"]["value"]);
  expectLine(fru, "Board Product", board["Model"]["value"]);
  expectLine(fru, "Board Serial", board["SerialNumber"]["value"]);
  expectLine(fru, "Board Part Number", board["PartNumber"]["value"]);
  expectLine(fru, "Product Manufacturer", product["Manufacturer"]["value"]);
  expectLine(fru, "Product Name", product["Model"]["value"]);
  expectLine(fru, "Product Part Number", product["PartNumber"]["value"]);
  expectLine(fru, "Product Version", product["Version"]["value"]);
  expectLine(fru, "Product Serial", product["SerialNumber"]["value"]);
  expectLine(fru, "Product Asset Tag", product["UserTracking"]["value"]);

  std::string source = Instance(document, "ZEP_ControllerNetwork", "ElementName", "channel 1")["AddressSource"]["value"];
  source[0] = static_cast<char>(std::toupper(source[0]));
  expectLine(lan, "IP Address Source", source);
  for (char const* name : {"zepadmin", "zepuser", "zepoff", "zep16"}) {
    std::string privilege = Instance(document, "ZEP_ControllerAccount", "UserID", name)["Privilege"]["value"];
    for (char& letter : privilege) letter = static_cast<char>(std::toupper(letter));
    EXPECT_THAT(users, testing::ContainsRegex(std::string(name) + " .*" + privilege));
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
  std::string const first = Inventory().dump();
  EXPECT_FALSE(ReadFile(fDir.Path("cache/zep/sdr-127.0.0.1")).empty());
  json const again = Inventory();
  EXPECT_EQ(Instance(again, "CIM_NumericSensor", "ElementName", "CPU Temp")["CurrentReading"]["value"], 91);
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

TEST_F(InventoryTest, AListOfHostsHasOneDocumentEach) {
  TSimulator::TSettings settings;
  settings.fAddress = "127.0.0.2";
  settings.fFru = FruImage();
  settings.fMore = SourcePath("tests/system/ipmi/sim/sensors.emu");
  TSimulator other(settings);
  other.WaitUntilReady();
  WriteFile(fDir.Path("hosts"), "127.0.0.1\n127.0.0.2\n");
  zep::TRun const run = Run({"--hosts", fDir.Path("hosts"), "--inventory"});
  EXPECT_EQ(run.fStatus, 0);
  std::istringstream lines(run.fOutput);
  std::size_t documents = 0;
  for (std::string line; std::getline(lines, line); ++documents)
    EXPECT_EQ(Instance(json::parse(line), "CIM_NumericSensor", "ElementName", "Fan 1")["CurrentReading"]["value"], 4500);
  EXPECT_EQ(documents, 2U);
}

TEST_F(InventoryTest, AControllerThatFallsSilentLeavesWhatWasReadInTime) {
  fSimulator.reset();
  TSimulator::TSettings settings;
  settings.fPort = 6230;
  settings.fFru = FruImage();
  settings.fMore = SourcePath("tests/system/ipmi/sim/sensors.emu");
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

TEST_F(InventoryTest, WithoutThePlugInTheReasonIsGiven) {
  std::filesystem::remove(fZep.Path("lib/libController.nsp.so"));
  zep::TRun const run = Run({"127.0.0.1", "--inventory"});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(run.fErrors,
              HasSubstr("inventory: libController.nsp.so: it is not installed; install the package libzepcore-ipmi"));
}

}  // namespace
}  // namespace NQRVZEP20
