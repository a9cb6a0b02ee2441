// SPDX-License-Identifier: Apache-2.0
#include "collect/Sections.h"

#include "TMemoryInstance.h"
#include "TMemoryNamespace.h"
#include "providers/reasons/TRecordWriter.h"
#include "tests/Support.h"
#include "tests/collect/SamplePlugIns.h"

#include <gmock/gmock.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::EndsWith;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

class SectionsTest : public testing::Test {
protected:
  TPlugIn PlugIn(std::string const& sampleLabel = "") const {
    return {"Test", "libTest.nsp.so", 0, "", {{"Test", std::make_shared<TNamespaceView>("Test", fNs, sampleLabel), 0, ""}}};
  }

  // The rows of a section, each as its cells separated by "|"; a missing value is its reason in angle brackets.
  std::vector<std::string> Rows(std::string const& key, std::string const& sampleLabel = "") const {
    auto const sections = MakeSections({PlugIn(sampleLabel)}, {key});
    EXPECT_EQ(sections.size(), 1u);
    fWhyEmpty = sections.at(0).fWhyEmpty;
    std::vector<std::string> rows;
    for (auto const& row : sections[0].fRows) {
      std::string text;
      for (auto const& cell : row)
        text += (text.empty() ? "" : "|") + (cell.IsKnown() ? *cell.fValue : "<" + cell.fMissing.fReason + ">");
      rows.push_back(text);
    }
    return rows;
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = boost::make_shared<TMemoryNamespace>("root/test");
  TRecordWriter fWriter{*fNs};
  mutable std::string fWhyEmpty;
};

constexpr TValueName kTypes[] = {{"1", "Other"}, {"26", "DDR4"}};

TRecord Module(std::string const& slot, TFinding<unsigned long> const& capacity, unsigned short type = 26,
               TFinding<std::string> const& description = std::string("DDR4 of the firmware")) {
  TRecord record("CIM_PhysicalMemory", "SMBIOS type 17");
  record.AddKey("Tag", slot);
  record.Add("ElementName", TFinding<std::string>(slot));
  record.Add("Capacity", capacity).Unit("byte");
  record.Add("MemoryType", TFinding<unsigned short>(type)).Names(kTypes);
  record.Add("Description", description);
  record.Add("ConfiguredMemoryClockSpeed", TFinding<unsigned>(2933)).Unit("hertz * 10^6");
  record.Add("Manufacturer", TFinding<std::string>("Example Works"));
  record.Add("PartNumber", TFinding<std::string>("EX-16"));
  record.Add("SerialNumber", TFinding<std::string>(TMissing{kMissingPlaceholder, "placeholder text \"0\""}));
  return record;
}

TEST_F(SectionsTest, EachInstanceIsARowWithUnitsNamesAndReasons) {
  fWriter.Write(Module("", 0ul), {Module("DIMM 1", 17179869184ul), Module("DIMM 2", TMissing{kMissingNotGiven, "unknown size"})},
                {});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("memory"), ElementsAre("DIMM 1|16 GiB|DDR4|2.933 GHz|Example Works|EX-16|<placeholder text \"0\">",
                                          "DIMM 2|<unknown size>|DDR4|2.933 GHz|Example Works|EX-16|<placeholder text \"0\">"));
}

TEST_F(SectionsTest, TheRunningSystemHasItsUptimeInDays) {
  auto const state = [](unsigned long seconds, std::vector<std::string> const& units) {
    TRecord record("ZEP_RunningState", "/proc/uptime", "CIM_StatisticalData");
    record.AddKey("InstanceID", std::to_string(seconds));
    record.Add("Uptime", TFinding<unsigned long>(seconds)).Unit("second");
    record.Add("FailedUnits", TFinding<std::vector<std::string>>(units));
    return record;
  };
  fWriter.Write(state(0, {}), {state(59, {}), state(7384, {"a.service", "b.service"}), state(93784, {})}, {});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("running"), ElementsAre(StartsWith("0 min|"), StartsWith("2 h 3 min|"), StartsWith("1 d 2 h 3 min|")));
  EXPECT_THAT(Rows("running"), ElementsAre(EndsWith("|none"), EndsWith("|a.service, b.service"), EndsWith("|none")));
}

TEST_F(SectionsTest, AnInterfaceHasItsAddressInPairsAndItsMTUAsANumber) {
  auto const interface = [](char const* name, char const* address) {
    TRecord record("ZEP_NetworkInterface", "rtnetlink", "CIM_LANEndpoint");
    record.AddKey("Name", name);
    record.Add("Kind", TFinding<std::string>("vlan"));
    record.Add("MACAddress", TFinding<std::string>(address));
    record.Add("MTU", TFinding<unsigned>(1500)).Unit("byte");
    record.Add("MasterInterface", TFinding<std::string>("br0"));
    record.Add("OperationalState", TFinding<std::string>("up"));
    return record;
  };
  fWriter.Write(interface("", ""), {interface("bond0.10", "525400112201"), interface("bond0.11", "52:54:00:11:22:02")}, {});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("interfaces"),
              ElementsAre("bond0.10|vlan|52:54:00:11:22:01|1500|br0|up", "bond0.11|vlan|52:54:00:11:22:02|1500|br0|up"));
}

TEST_F(SectionsTest, AFileSystemHasItsSourceAndItsPlace) {
  auto const fileSystem = [](char const* name, char const* root) {
    TRecord record("CIM_UnixLocalFileSystem", "statvfs");
    record.AddKey("Name", name);
    record.Add("Root", TFinding<std::string>(root));
    record.Add("FileSystemType", TFinding<std::string>("tmpfs"));
    record.Add("FileSystemSize", TFinding<unsigned long>(4096)).Unit("byte");
    record.Add("AvailableSpace", TFinding<unsigned long>(1024)).Unit("byte");
    record.Add("ReadOnly", TFinding<bool>(false));
    return record;
  };
  fWriter.Write(fileSystem("", ""), {fileSystem("tmpfs on /run (2)", "/run"), fileSystem("/dev/sda on 1", "/")}, {});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("file-systems"), ElementsAre("tmpfs|/run|tmpfs|4 KiB|1 KiB|false", "/dev/sda on 1|/|tmpfs|4 KiB|1 KiB|false"));
}

TEST_F(SectionsTest, PCIDevicesAreSortedByTheirAddresses) {
  auto const function = [](char const* className, char const* address) {
    TRecord record(className, "sysfs");
    record.AddKey("DeviceID", address);
    record.Add("Name", TFinding<std::string>(className));
    return record;
  };
  fWriter.Write(function("CIM_PCIDevice", "0000:00:02.0"));
  fWriter.Write(function("CIM_PCIBridge", "0000:00:01.0"));
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("pci"), ElementsAre(StartsWith("0000:00:01.0|CIM_PCIBridge|"), StartsWith("0000:00:02.0|")));
}

TEST_F(SectionsTest, TheReasonForNoRowMayBeThatOfAClassBelow) {
  TRecord disk("CIM_DiskDrive", "sysfs");
  disk.AddKey("DeviceID", "");
  fWriter.Write(disk, {}, {kMissingNotGiven, "no disk is there"});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("disks"), IsEmpty());
  EXPECT_EQ(fWhyEmpty, "no disk is there");
  EXPECT_THAT(Rows("usb"), IsEmpty());
  EXPECT_EQ(fWhyEmpty, "no provider describes them");
}

TEST_F(SectionsTest, TheDescriptionNamesAnotherMemoryType) {
  fWriter.Write(Module("", 0ul), {Module("DIMM 1", 1ul, 1, std::string("DDR5")), Module("DIMM 2", 1ul, 1, TMissing())}, {});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("memory"), ElementsAre(HasSubstr("|DDR5|"), HasSubstr("|Other|")));
}

TEST_F(SectionsTest, TheTitleAndColumnsAreGiven) {
  auto const sections = MakeSections({PlugIn()}, {"usb", "disks"});
  ASSERT_EQ(sections.size(), 2u);
  EXPECT_EQ(sections[0].fKey, "disks");
  EXPECT_EQ(sections[1].fTitle, "USB devices");
  EXPECT_THAT(sections[1].fColumns, ElementsAre("Device", "Maker", "Product", "Serial number"));
}

TEST_F(SectionsTest, AnIdentifierIsFoundByItsDescription) {
  TRecord drive("CIM_DiskDrive", "sysfs");
  drive.AddKey("DeviceID", "sda");
  drive.Add("ElementName", TFinding<std::string>("Model 5"));
  drive.Add("IdentifyingDescriptions", TFinding<std::vector<std::string>>(std::vector<std::string>{"NAA", "Serial number"}));
  drive.Add("OtherIdentifyingInfo", TFinding<std::vector<std::string>>(std::vector<std::string>{"5000c500", "Z1"}));
  fWriter.Write(drive);
  EXPECT_THAT(Rows("disks"), ElementsAre("sda|Model 5|Z1|<the provider has no property MaxMediaSize>|"
                                         "<the provider has no property StatusDescriptions>"));
}

TRecord Volume(std::string const& name, std::uint64_t blocks, std::uint64_t blockSize) {
  TRecord record("CIM_StorageVolume", "sysfs");
  record.AddKey("DeviceID", name);
  record.Add("ElementName", TFinding<std::string>("data/" + name));
  record.Add("NumberOfBlocks", TFinding<std::uint64_t>(blocks));
  record.Add("BlockSize", TFinding<std::uint64_t>(blockSize)).Unit("byte");
  record.Add("StatusDescriptions", TFinding<std::vector<std::string>>(std::vector<std::string>{"active"}));
  return record;
}

TEST_F(SectionsTest, AVolumeHasASizeOfBlocks) {
  fWriter.Write(Volume("", 0, 0), {Volume("dm-0", 2097152, 512), Volume("dm-1", UINT64_MAX, 512)}, {});
  EXPECT_THAT(Rows("volumes"),
              ElementsAre("dm-0|data/dm-0|1 GiB|active", "dm-1|data/dm-1|<NumberOfBlocks times BlockSize is not a size>|active"));
}

TRecord Route(std::string const& destination, TFinding<std::string> const& mask, TFinding<std::uint8_t> const& prefix) {
  TRecord record("CIM_NextHopIPRoute", "rtnetlink");
  record.AddKey("InstanceID", "route " + destination);
  record.Add("DestinationAddress", TFinding<std::string>(destination));
  record.Add("DestinationMask", mask);
  record.Add("PrefixLength", prefix);
  record.Add("InterfaceName", TFinding<std::string>("eth0"));
  return record;
}

TEST_F(SectionsTest, ARouteHasAMaskOrAPrefix) {
  TMissing const other{kMissingNotApplicable, "the route is of the other family"};
  fWriter.Write(Route("", other, other),
                {Route("192.0.2.0", std::string("255.255.255.0"), other), Route("fd00::", other, std::uint8_t(64))}, {});
  std::string const missing = "<the provider has no property ";
  std::string const end = missing + "Gateway>|eth0|" + missing + "Metric>|" + missing + "Protocol>";
  EXPECT_THAT(Rows("routes"), ElementsAre("192.0.2.0|255.255.255.0|" + end, "fd00::|64|" + end));
}

TEST_F(SectionsTest, AnInstanceThatHasOnlyItsNameIsOmitted) {
  TRecord device("CIM_PCIDevice", "sysfs");
  device.AddKey("DeviceID", "0000:00:01.0");
  fWriter.Write(device);
  EXPECT_THAT(Rows("pci"), IsEmpty());
}

TEST_F(SectionsTest, AnEmptySectionHasItsReason) {
  EXPECT_THAT(Rows("memory"), IsEmpty());
  EXPECT_EQ(fWhyEmpty, "no provider describes them");
  fWriter.Write(Module("", 0ul), {}, {kMissingNotGiven, "every slot is empty"});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("memory"), IsEmpty());
  EXPECT_EQ(fWhyEmpty, "every slot is empty");
}

TEST_F(SectionsTest, WithASampleTheRowsOfThisMachineAreNotShown) {
  fWriter.Write(Module("DIMM 1", 1ul));
  EXPECT_THAT(Rows("memory", "SAMPLE"), IsEmpty());
  EXPECT_EQ(fWhyEmpty, "the sample does not describe them");
  TRecord disk("CIM_DiskDrive", "sysfs");
  disk.AddKey("DeviceID", "");
  fWriter.Write(disk, {}, {kMissingNotGiven, "this machine has no disk"});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("disks", "SAMPLE"), IsEmpty());
  EXPECT_EQ(fWhyEmpty, "the sample does not describe them") << "the reason is not about the sample";
  auto const sections = MakeSections(SamplePlugIns(), {"memory"});
  EXPECT_EQ(sections.at(0).fRows.size(), 8u);
}

TEST_F(SectionsTest, OtherClassesAreCounted) {
  fWriter.Write(Module("DIMM 1", 1ul));
  fNs->DefineClass("X_Battery").Key("Name", "string");
  fNs->DefineClass("X_Cell", "X_Battery");
  fNs->AddInstance("X_Battery", {{"Name", "front"}});
  fNs->AddInstance("X_Cell", {{"Name", "1"}});
  fNs->AddInstance("X_Cell", {{"Name", "2"}});
  fWriter.WriteMissing();
  EXPECT_THAT(Rows("other"), ElementsAre("X_Battery|1|root/test", "X_Cell|2|root/test"));
}

TEST_F(SectionsTest, WithASampleTheClassesOfThisMachineAreNotCounted) {
  fNs->DefineClass("X_Battery").Key("Name", "string");
  fNs->AddInstance("X_Battery", {{"Name", "front"}});
  EXPECT_THAT(Rows("other", "SAMPLE"), IsEmpty());
}

TEST_F(SectionsTest, EveryKeyMakesASection) {
  auto const keys = SectionKeys();
  EXPECT_EQ(MakeSections({PlugIn()}, keys).size(), keys.size());
  EXPECT_THAT(MakeSections({PlugIn()}, {"none"}), IsEmpty());
}

}  // namespace
}  // namespace NQRVZEP20
