// SPDX-License-Identifier: Apache-2.0
#include "providers/devices/PciRecords.h"

#include "tests/Support.h"
#include "tests/providers/devices/RecordText.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::IsEmpty;

class PciRecordsTest : public testing::Test {
protected:
  // Adds a function below /sys/devices/pci0000:00 and `above`, with these files.
  void Add(std::string const& name, std::vector<std::pair<std::string, std::string>> const& files,
           std::string const& above = "") {
    fs::path const directory = fs::path(fDir.Path("sys/devices/pci0000:00")) / above / name;
    fs::create_directories(directory);
    for (auto const& [file, text] : files) WriteFile((directory / file).string(), text + "\n");
    fs::create_directories(fDir.Path("sys/bus/pci/devices"));
    fs::create_symlink("/sys/devices/pci0000:00/" + (above.empty() ? name : above + "/" + name),
                       fDir.Path("sys/bus/pci/devices/" + name));
  }
  void Answer(std::string const& name, std::string const& text) {
    fs::create_directories(fDir.Path("zep-answers/pci-names"));
    WriteFile(fDir.Path("zep-answers/pci-names/" + name), text);
  }

  std::vector<TPciFunction> Functions() const { return PciFunctions(fFiles, TComputerSystem(fFiles)); }
  TRecord Only() const {
    auto const functions = Functions();
    EXPECT_EQ(functions.size(), 1u);
    return functions.empty() ? PciDeviceShape(TComputerSystem(fFiles)) : functions.front().fRecord;
  }

  TTempDir fDir;
  TMachineFiles fFiles{fDir.Path()};
};

std::vector<std::pair<std::string, std::string>> const kPort = {{"class", "0x020000"},
                                                                {"vendor", "0x8086"},
                                                                {"device", "0x10d3"},
                                                                {"subsystem_vendor", "0x8086"},
                                                                {"subsystem_device", "0x0000"},
                                                                {"revision", "0x02"},
                                                                {"numa_node", "1"},
                                                                {"current_link_speed", "2.5 GT/s PCIe"},
                                                                {"current_link_width", "1"},
                                                                {"max_link_speed", "5.0 GT/s PCIe"},
                                                                {"max_link_width", "4"}};

TEST_F(PciRecordsTest, AFunctionHasItsNumbersAndNames) {
  Add("0000:03:00.1", kPort);
  Answer("8086-10d3-8086-0000-020000", "Intel Corporation\n82574L Gigabit Network Connection\n\nEthernet controller\n");
  TRecord const record = Only();
  EXPECT_EQ(record.GetClassName(), "CIM_PCIDevice");
  EXPECT_EQ(ValueIn(record, "DeviceID"), "0000:03:00.1");
  EXPECT_EQ(ValueIn(record, "Name"), "Intel Corporation 82574L Gigabit Network Connection");
  EXPECT_EQ(ValueIn(record, "ElementName"), "82574L Gigabit Network Connection");
  EXPECT_EQ(ValueIn(record, "Caption"), "Ethernet controller");
  EXPECT_EQ(ValueIn(record, "ClassCode"), "2");
  EXPECT_EQ(ValueIn(record, "VendorID"), "32902");
  EXPECT_EQ(ValueIn(record, "PCIDeviceID"), "4307");
  EXPECT_EQ(ValueIn(record, "SubsystemID"), "0");
  EXPECT_EQ(ValueIn(record, "RevisionID"), "2");
  EXPECT_EQ(ValueIn(record, "BusNumber"), "3");
  EXPECT_EQ(ValueIn(record, "FunctionNumber"), "1");
  EXPECT_EQ(ValueIn(record, "IdentifyingDescriptions"), "{ Vendor, Programming interface, NUMA node }");
  EXPECT_EQ(ValueIn(record, "OtherIdentifyingInfo"), "{ Intel Corporation, 00, 1 }");
}

TEST_F(PciRecordsTest, RegistersComeFromTheConfigurationSpace) {
  Add("0000:03:00.0", kPort);
  std::string bytes(64, '\0');
  bytes[0x04] = '\x06', bytes[0x05] = '\x04', bytes[0x0c] = '\x10', bytes[0x0d] = '\xff', bytes[0x3d] = '\x01';
  WriteFile(fDir.Path("sys/devices/pci0000:00/0000:03:00.0/config"), bytes);
  EXPECT_EQ(ValueIn(Only(), "CommandRegister"), "1030");
  EXPECT_EQ(ValueIn(Only(), "CacheLineSize"), "16");
  EXPECT_EQ(ValueIn(Only(), "LatencyTimer"), "255");
  EXPECT_EQ(ValueIn(Only(), "InterruptPin"), "1");
  WriteFile(fDir.Path("sys/devices/pci0000:00/0000:03:00.0/config"), bytes.substr(0, 5));
  EXPECT_EQ(ValueIn(Only(), "CommandRegister"), "<the configuration space is cut off>");
}

TEST_F(PciRecordsTest, NamesThatTheListDoesNotContainHaveAReason) {
  Add("0000:03:00.0", kPort);
  Answer("8086-10d3-8086-0000-020000", "Intel Corporation\n\n\n\n");
  EXPECT_EQ(ValueIn(Only(), "Name"), "Intel Corporation");
  EXPECT_EQ(ValueIn(Only(), "ElementName"), "<the list of PCI identifiers (pci.ids) does not contain the device>");
  EXPECT_EQ(ValueIn(Only(), "Caption"), "<the list of PCI identifiers (pci.ids) does not contain the class>");
}

TEST_F(PciRecordsTest, ALinkHasItsSpeedNowAndAtMost) {
  Add("0000:03:00.0", kPort);
  auto const functions = Functions();
  ASSERT_EQ(functions.size(), 1u);
  ASSERT_TRUE(functions[0].fLink);
  TRecord const& link = functions[0].fLink->fRecord;
  EXPECT_EQ(ValueIn(link, "TransferRate"), "2.5");
  EXPECT_EQ(ValueIn(link, "MaxTransferRate"), "5");
  EXPECT_EQ(ValueIn(link, "Width"), "1");
  EXPECT_EQ(ValueIn(link, "MaxWidth"), "4");
  EXPECT_EQ(ValueIn(link, "Speed"), "2000000000");
  EXPECT_EQ(ValueIn(link, "MaxSpeed"), "16000000000");
  EXPECT_EQ(*functions[0].fLink->fSpeed, 2000000000u);
}

TEST_F(PciRecordsTest, AFunctionKnowsTheBridgeAbove) {
  Add("0000:00:1c.0", {{"class", "0x060400"},
                       {"vendor", "0x8086"},
                       {"device", "0x1234"},
                       {"secondary_bus_number", "3"},
                       {"subordinate_bus_number", "5"}});
  Add("0000:03:00.0", {{"class", "0x010802"}, {"vendor", "0x1b36"}, {"device", "0x0010"}}, "0000:00:1c.0");
  auto const functions = Functions();
  ASSERT_EQ(functions.size(), 2u);
  EXPECT_TRUE(functions[0].fIsBridge);
  EXPECT_EQ(functions[0].fBridge, "");
  EXPECT_EQ(functions[0].fRecord.GetClassName(), "CIM_PCIBridge");
  EXPECT_EQ(ValueIn(functions[0].fRecord, "BridgeType"), "4");
  EXPECT_EQ(ValueIn(functions[0].fRecord, "SecondayBusNumber"), "3");
  EXPECT_EQ(ValueIn(functions[0].fRecord, "SubordinateBusNumber"), "5");
  EXPECT_EQ(functions[1].fBridge, "0000:00:1c.0");
  EXPECT_FALSE(functions[1].fLink);
}

TEST_F(PciRecordsTest, ABridgeToAnotherBusHasNoBusNumbers) {
  Add("0000:00:00.0", {{"class", "0x060000"}, {"vendor", "0x8086"}, {"device", "0x29c0"}});
  EXPECT_EQ(ValueIn(Only(), "BridgeType"), "0");
  EXPECT_EQ(ValueIn(Only(), "SecondayBusNumber"), "<the bridge does not lead to a PCI bus>");
}

TEST_F(PciRecordsTest, AFunctionWithoutSubsystemHasAReason) {
  Add("0000:00:01.0", {{"class", "0x060000"},
                       {"vendor", "0x8086"},
                       {"device", "0x29c0"},
                       {"subsystem_vendor", "0x0000"},
                       {"subsystem_device", "0x0000"}});
  EXPECT_EQ(ValueIn(Only(), "SubsystemID"), "<the device has no subsystem>");
}

TEST_F(PciRecordsTest, AFunctionThatVanishesIsOmitted) {
  Add("0000:00:01.0", {});
  fs::create_symlink("/sys/devices/nowhere", fDir.Path("sys/bus/pci/devices/0000:00:02.0"));
  EXPECT_THAT(Functions(), IsEmpty());
}

TEST_F(PciRecordsTest, WithoutFunctionsThereIsAReason) {
  EXPECT_EQ(WhyNoPciDevices(fFiles).fReason, "the kernel lists no PCI devices: /sys/bus/pci/devices/ does not exist");
  fs::create_directories(fDir.Path("sys/bus/pci/devices"));
  EXPECT_EQ(WhyNoPciDevices(fFiles).fReason, "no PCI devices are listed in /sys/bus/pci/devices/");
}

TEST_F(PciRecordsTest, ASlotHasItsAddress) {
  fs::create_directories(fDir.Path("sys/bus/pci/slots/0-2"));
  WriteFile(fDir.Path("sys/bus/pci/slots/0-2/address"), "0000:04:00\n");
  WriteFile(fDir.Path("sys/bus/pci/slots/0-2/power"), "1\n");
  auto const slots = PciSlots(fFiles);
  ASSERT_EQ(slots.size(), 1u);
  EXPECT_EQ(slots[0].fAddress, "0000:04:00");
  EXPECT_EQ(ValueIn(slots[0].fRecord, "Tag"), "PCI slot 0-2");
  EXPECT_EQ(ValueIn(slots[0].fRecord, "ElementName"), "0-2");
  EXPECT_EQ(ValueIn(slots[0].fRecord, "PoweredOn"), "true");
}

// The numbers are those of a port that every version of the list contains.
TEST(TPciIdsTest, NamesComeFromTheList) {
  NEEDS(fs::exists("/usr/share/misc/pci.ids"), "the package pci.ids");
  TPciIds ids;
  TPciNames const names = ids.NamesOf({0x8086, 0x10d3, 0, 0, 0x020000}, TMachineFiles("/"));
  EXPECT_EQ(*names.fVendor, "Intel Corporation");
  EXPECT_EQ(*names.fDevice, "82574L Gigabit Network Connection");
  EXPECT_EQ(*names.fClass, "Ethernet controller");
  EXPECT_FALSE(names.fSubsystem);
}

}  // namespace
}  // namespace NQRVZEP20
