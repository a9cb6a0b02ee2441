// SPDX-License-Identifier: Apache-2.0

// The namespace that the provider fills, read as a front end reads it.

#include "providers/host/HostNamespace.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TAddToVectorCallback.h"
#include "TCIMSchemaHelper.h"
#include "TNamespaceProviderManager.h"
#include "TOSSpecific.h"
#include "providers/memory/TMemoryNamespace.h"
#include "tests/Machines.h"
#include "tests/SmbiosTables.h"
#include "tests/providers/NamespaceText.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/ScsiDirectory.h"
#include "tests/providers/host/Structures.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <unistd.h>
#include <boost/make_shared.hpp>

#include <cctype>
#include <chrono>
#include <functional>
#include <set>
#include <thread>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;
using testing::UnorderedElementsAre;

using TInstances = std::vector<boost::shared_ptr<ICIMInstance>>;

class HostNamespaceTest : public testing::Test {
protected:
  void FillFromFile(std::string const& path) {
    TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", path.c_str());
    TEnvironmentGuard const name("ZEP_HOST_NAME", "db1");
    TEnvironmentGuard const scsi("ZEP_SCSI_DEVICES", fScsiDevices.c_str());
    fNs = boost::make_shared<TMemoryNamespace>("root/test");
    FillHostNamespace(*fNs);
  }
  void Fill(std::string const& table) {
    WriteFile(fDir.Path("table"), table);
    FillFromFile(fDir.Path("table"));
  }

  TInstances InstancesOf(std::string const& className) {
    TInstances instances;
    fNs->GetClass(className, TCIMContext())->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), TCIMContext());
    return instances;
  }

  static std::string TextOf(ICIMInstance const& instance, std::string const& property) {
    TCIMValue const value = instance.GetProperty(property, TCIMContext())->GetValue(TCIMContext());
    return value.IsNull() ? "NULL" : value.ToString();
  }
  std::string TextOfOnly(std::string const& className, std::string const& property) {
    TInstances const instances = InstancesOf(className);
    EXPECT_EQ(instances.size(), 1u) << className;
    return TextOf(*instances.at(0), property);
  }

  // Whether it is the path of an instance of the class, or its name. Other classes may have names that begin with the same word.
  static bool IsOf(std::string const& path, std::string const& className) {
    return path == className || path.compare(0, className.size() + 1, className + ".") == 0;
  }

  // "property: reason" of each missing value of the instances of the class, and of the class itself.
  std::vector<std::string> MissingOf(std::string const& className) {
    std::vector<std::string> missing;
    for (auto const& instance : InstancesOf("ZEP_MissingValue"))
      if (IsOf(TextOf(*instance, "ElementPath"), className))
        missing.push_back(TextOf(*instance, "ElementProperty") + ": " + TextOf(*instance, "Reason"));
    return missing;
  }

  TTempDir fDir;
  std::string fScsiDevices = fDir.Path("no-scsi");
  boost::shared_ptr<TMemoryNamespace> fNs;
};

// The value, or the name of the thrown status.
std::string ResultOf(std::function<std::string()> const& query) {
  try {
    return query();
  } catch (TZEPException const& thrown) {
    return thrown.what();
  }
}

TEST_F(HostNamespaceTest, TheSchemaHelperReadsTheRealTables) {
  struct TRow {
    char const *fTable, *fProduct, *fMtm, *fSerial;
  } const rows[] = {
      {"full", "Server Q100 -[1234AB7]-", "1234AB7", "KQ12345"},
      {"bare7", "1234AB7", "1234AB7", "KQ12345"},
      {"eight", "1234AB78", "kZEPStatusInvalidFormat", "KQ12345"},
      {"no-serial", "Server-[5678XY1]-", "5678XY1", "kZEPStatusNotFound"},
      {"two-dashes", "Rack-Server Q200 -[5678XY1]-", "5678XY1", "kZEPStatusInvalidFormat"},
      {"qemu-own", "Standard PC (i440FX + PIIX, 1996)", "kZEPStatusInvalidFormat", "kZEPStatusNotFound"},
      {"entry64", "Server Q100 -[1234AB7]-", "1234AB7", "KQ12345"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fTable);
    FillFromFile(RealTablePath(row.fTable));
    EXPECT_EQ(ResultOf([&] { return TCIMSchemaHelper::GetSystemProductName(fNs); }), row.fProduct);
    EXPECT_EQ(ResultOf([&] { return TCIMSchemaHelper::GetMTM(fNs); }), row.fMtm);
    EXPECT_EQ(ResultOf([&] { return TCIMSchemaHelper::GetSerialNumber(fNs, TCIMContext()); }), row.fSerial);
    EXPECT_EQ(ResultOf([&] { return TCIMSchemaHelper::GetSystemName(fNs); }), "db1");
    EXPECT_EQ(ResultOf([&] { return TCIMSchemaHelper::GetDataSourceVersion(fNs, TCIMContext()); }), TEST_VERSION);
    EXPECT_EQ(ResultOf([&] { return TCIMSchemaHelper::GetDataSourceBuild(fNs, TCIMContext()); }), TEST_BUILD_ID);
    EXPECT_EQ(ResultOf([&] { return TCIMSchemaHelper::GetOperatingSystemType(fNs); }), "Linux");
  }
}

TEST_F(HostNamespaceTest, TheSampleIsReadCompletely) {
  FillFromFile(SamplePath());
  EXPECT_EQ(TextOfOnly("QRVSG_ComputerSystem", "UUID"), "6F1D2C3B-4A59-4687-9708-1A2B3C4D5E6F");
  EXPECT_EQ(TextOfOnly("CIM_BIOSElement", "Version"), "-[QAE118B-1.30]-");
  EXPECT_EQ(TextOfOnly("CIM_Chassis", "Height"), "3.5");
  ASSERT_EQ(InstancesOf("CIM_Processor").size(), 2u);
  EXPECT_EQ(TextOf(*InstancesOf("CIM_Processor")[1], "Name"), "CPU 2");
  EXPECT_EQ(TextOf(*InstancesOf("CIM_Processor")[1], "DeviceID"), "Processor 1");
  ASSERT_EQ(InstancesOf("CIM_PhysicalMemory").size(), 8u);
  EXPECT_EQ(TextOf(*InstancesOf("CIM_PhysicalMemory")[7], "ElementName"), "CPU 2 DIMM 4");
  EXPECT_EQ(TextOf(*InstancesOf("CIM_PhysicalMemory")[7], "Capacity"), "17179869184");
}

TEST_F(HostNamespaceTest, TheUuidEqualsThatOfDmidecodeForEveryVersion) {
  std::string const dmidecode = OutputOfCommand("PATH=$PATH:/usr/sbin:/sbin command -v dmidecode");
  NEEDS(!dmidecode.empty(), "dmidecode is not installed");
  std::string const table = TStructureMaker(1, 0x1b)
                                .Text(0x05, "Server Q100 -[1234AB7]-")
                                .Bytes(0x08, "\x33\x22\x11\x00\x55\x44\x77\x66\x88\x99\xaa\xbb\xcc\xdd\xee\xff"s)
                                .Table() +
                            EndOfTable();
  std::vector<std::string> entryPoints = {EntryPointLegacy(table.size()), EntryPointLegacy(table.size(), 32, 0x21)};
  for (int version : {0x200, 0x201, 0x203, 0x204, 0x205, 0x206, 0x207, 0x208, 0x21F, 0x221, 0x233, 0x300})
    entryPoints.push_back(EntryPoint32(table.size(), 32, 0x1F, version));
  for (int version : {0x205, 0x300, 0x303, 0x307}) entryPoints.push_back(EntryPoint64(table.size(), 32, 0x18, version));

  std::set<std::string> seen;
  for (std::string const& entryPoint : entryPoints) {
    SCOPED_TRACE(testing::PrintToString(entryPoint));
    Fill(entryPoint + table);
    std::string uuid = TextOfOnly("QRVSG_ComputerSystem", "UUID");
    for (char& c : uuid) c = static_cast<char>(std::tolower(c));
    EXPECT_EQ(uuid + "\n", OutputOfCommand(dmidecode.substr(0, dmidecode.find('\n')) + " --from-dump " + fDir.Path("table") +
                                           " -s system-uuid 2>/dev/null | tr A-F a-f"));
    seen.insert(uuid);
  }
  EXPECT_THAT(seen, ElementsAre("00112233-4455-6677-8899-aabbccddeeff", "33221100-5544-7766-8899-aabbccddeeff"));
}

TEST_F(HostNamespaceTest, TheUuidOfABareTableFollowsTheEntryPointInItsDirectory) {
  std::string const table =
      TStructureMaker(1, 0x1b).Bytes(0x08, "\x33\x22\x11\x00\x55\x44\x77\x66\x88\x99\xaa\xbb\xcc\xdd\xee\xff"s).Table() +
      EndOfTable();
  Fill(table);
  EXPECT_EQ(TextOfOnly("QRVSG_ComputerSystem", "UUID"), "00112233-4455-6677-8899-AABBCCDDEEFF");
  WriteFile(fDir.Path("smbios_entry_point"), EntryPoint32(table.size(), 0xE0000, 0x1F, 0x204).substr(0, 0x1F));
  Fill(table);
  EXPECT_EQ(TextOfOnly("QRVSG_ComputerSystem", "UUID"), "33221100-5544-7766-8899-AABBCCDDEEFF");
}

TEST_F(HostNamespaceTest, ClassesHaveAFixedOrder) {
  FillFromFile(SamplePath());
  std::vector<std::string> names;  // of the classes with properties
  auto const add = [&](boost::shared_ptr<ICIMClass> cls) {
    cls->EnumeratePropertyDecls(
        [&](boost::shared_ptr<ICIMPropertyDecl>) {
          names.push_back(cls->GetName(TCIMContext()));
          return false;
        },
        TCIMContext());
    return true;
  };
  fNs->EnumerateClasses(
      [&](boost::shared_ptr<ICIMClass> root) {
        add(root);
        root->EnumerateSubClasses(add, TCIMContext());
        return true;
      },
      TCIMContext());
  EXPECT_THAT(names, ElementsAreArray({"QRVSG_ComputerSystem",
                                       "CIM_Processor",
                                       "CIM_Memory",
                                       "ZEP_NUMANode",
                                       "ZEP_IPMIInterface",
                                       "ZEP_TrustedPlatformModule",
                                       "QRVSG_SCSIDevice",
                                       "QRVSG_OperatingSystem",
                                       "CIM_ProcessorCore",
                                       "CIM_BIOSElement",
                                       "CIM_Chassis",
                                       "CIM_Card",
                                       "ZEP_ProcessorChip",
                                       "CIM_PhysicalMemory",
                                       "ZEP_OnboardDevice",
                                       "CIM_Slot",
                                       "ZEP_RunningState",
                                       "ZEP_FirmwareSettings",
                                       "ZEP_ChassisState",
                                       "ZEP_ProcessorSettings",
                                       "ZEP_MemoryModuleSettings",
                                       "ZEP_BootSettings",
                                       "ZEP_Virtualization",
                                       "CIM_ProcessorCapabilities",
                                       "ZEP_ProcessorWeakness",
                                       "CIM_MemoryCapacity",
                                       "CIM_RunningOS",
                                       "CIM_ComputerSystemPackage",
                                       "CIM_Realizes",
                                       "CIM_ElementStatisticalData",
                                       "QRVSG_ZEPProduct",
                                       "CIM_SystemBIOS",
                                       "CIM_SystemDevice",
                                       "CIM_Container",
                                       "CIM_ElementSettingData",
                                       "ZEP_MissingValue"}));
}

TEST_F(HostNamespaceTest, ADeclarationHasKeyTypeAndSource) {
  FillFromFile(SamplePath());
  auto const cls = fNs->GetClass("QRVSG_ComputerSystem", TCIMContext());
  auto const source = [&](char const* property) {
    auto const qualifier = cls->GetPropertyDecl(property, TCIMContext())->GetQualifier("ValueSource", TCIMContext());
    return qualifier ? qualifier->GetValue(TCIMContext()).ToString() : "none";
  };
  EXPECT_EQ(source("SerialNumber"), "SMBIOS type 1 (file)");
  EXPECT_EQ(source("Name"), "ZEP_HOST_NAME");
  EXPECT_EQ(source("CreationClassName"), "none");
  EXPECT_TRUE(cls->GetPropertyDecl("Name", TCIMContext())->IsKey(TCIMContext()));
  EXPECT_FALSE(cls->GetPropertyDecl("SerialNumber", TCIMContext())->IsKey(TCIMContext()));
  EXPECT_EQ(
      fNs->GetClass("CIM_PhysicalMemory", TCIMContext())->GetPropertyDecl("Capacity", TCIMContext())->GetType(TCIMContext()),
      TCIMValue::TCIMType::kCIMTypeUint64);
}

TEST_F(HostNamespaceTest, EveryInstanceIsFoundByItsPath) {
  FillFromFile(SamplePath());
  int found = 0;
  fNs->EnumerateClasses(
      [&](boost::shared_ptr<ICIMClass> cls) {
        if (cls->GetClassFlag(TCIMContext())) return true;
        for (auto const& instance : InstancesOf(cls->GetName(TCIMContext()))) {
          std::string const path = "root/test:" + instance->GetPath(TCIMContext()).GetPath();
          EXPECT_EQ(TCIMReference(fNs, path, TCIMContext()).GetCIMElement(false), instance) << path;
          ++found;
        }
        return true;
      },
      TCIMContext());
  // 11 of which there is one each, 2 processors and their chips, 8 modules and their settings, 6 slots, and 4 onboard devices
  EXPECT_EQ(found, static_cast<int>(41 + InstancesOf("ZEP_MissingValue").size()));
}

TEST_F(HostNamespaceTest, EachMissingValueOfAnInstanceHasAReason) {
  FillFromFile(RealTablePath("no-serial"));
  EXPECT_THAT(MissingOf("QRVSG_ComputerSystem"),
              UnorderedElementsAre("SerialNumber: not given by the firmware", "UUID: not set by the firmware (all zeros)",
                                   "SKUNumber: not given by the firmware", "Family: not given by the firmware",
                                   "IdentifyingDescriptions: the SMBIOS tables contain no strings of type 11 or 12",
                                   "OtherIdentifyingInfo: the SMBIOS tables contain no strings of type 11 or 12"));
}

TEST_F(HostNamespaceTest, NothingIsNullWithoutAReason) {
  for (std::string const& table : kRealTables) {
    SCOPED_TRACE(table);
    FillFromFile(RealTablePath(table));
    int nulls = 0;
    for (char const* className : {"QRVSG_ComputerSystem", "QRVSG_OperatingSystem", "QRVSG_ZEPProduct", "CIM_BIOSElement",
                                  "CIM_Chassis", "CIM_Processor", "CIM_PhysicalMemory", "CIM_MemoryCapacity", "ZEP_RunningState",
                                  "ZEP_FirmwareSettings", "ZEP_ChassisState", "ZEP_MemoryModuleSettings", "ZEP_ProcessorChip"})
      for (auto const& instance : InstancesOf(className))
        instance->EnumerateProperties(
            [&](boost::shared_ptr<ICIMProperty> property) {
              nulls += property->GetValue(TCIMContext()).IsNull();
              return true;
            },
            TCIMContext());
    auto const missing = InstancesOf("ZEP_MissingValue");
    auto const withoutInstance = std::count_if(missing.begin(), missing.end(),
                                               [](auto const& instance) { return TextOf(*instance, "ElementProperty").empty(); });
    EXPECT_EQ(missing.size(), static_cast<std::size_t>(nulls + withoutInstance));
    EXPECT_GT(nulls, 0);
    for (auto const& instance : missing) {
      EXPECT_NE(TextOf(*instance, "Reason"), "");
      EXPECT_NE(TextOf(*instance, "Code"), "");
    }
  }
}

TEST_F(HostNamespaceTest, WithoutTablesThereAreStillAMachineNameAndASystem) {
  FillFromFile(fDir.Path("nothing"));
  std::string const reason = "the SMBIOS table file " + fDir.Path("nothing") + " does not exist";
  EXPECT_EQ(TextOfOnly("QRVSG_ComputerSystem", "Name"), "db1");
  EXPECT_EQ(TextOfOnly("QRVSG_ComputerSystem", "SerialNumber"), "NULL");
  EXPECT_EQ(TextOfOnly("QRVSG_OperatingSystem", "OSType"), "Linux");
  for (char const* className : {"CIM_BIOSElement", "CIM_Chassis", "CIM_Processor", "CIM_PhysicalMemory"}) {
    SCOPED_TRACE(className);
    EXPECT_THAT(InstancesOf(className), IsEmpty());
    EXPECT_THAT(MissingOf(className), ElementsAre(": " + reason));
  }
  EXPECT_EQ(MissingOf("QRVSG_ComputerSystem").size(), 9u);
}

TEST_F(HostNamespaceTest, EmptySocketsAndSlotsHaveNoInstance) {
  Fill(TStructureMaker(4, 0x30).Text(0x04, "CPU 1").Table() +
       TStructureMaker(4, 0x30).Text(0x04, "CPU 2").Byte(0x18, 0x41).Table() +
       TStructureMaker(17, 0x22).Text(0x10, "DIMM 1").Table() + EndOfTable());
  EXPECT_EQ(TextOfOnly("CIM_Processor", "Name"), "CPU 2");
  EXPECT_EQ(TextOfOnly("CIM_Processor", "DeviceID"), "Processor 0");
  EXPECT_THAT(InstancesOf("CIM_PhysicalMemory"), IsEmpty());
  EXPECT_THAT(MissingOf("CIM_PhysicalMemory"), ElementsAre(": the firmware reports every memory slot as empty"));
  EXPECT_THAT(MissingOf("CIM_Chassis"), ElementsAre(": the SMBIOS tables contain no structure of type 3 (Chassis)"));
}

TEST_F(HostNamespaceTest, AMissingKeyIsOmittedFromThePath) {
  std::string const bios = TStructureMaker(0, 0x18).Text(0x04, "Example Works").Table();
  Fill(bios + bios + EndOfTable());
  auto const instances = InstancesOf("CIM_BIOSElement");
  ASSERT_EQ(instances.size(), 2u);
  EXPECT_EQ(
      instances[1]->GetPath(TCIMContext()).GetPath(),
      "CIM_BIOSElement.Name=\"BIOS 1\",SoftwareElementID=\"BIOS 1\",SoftwareElementState=\"3\",TargetOperatingSystem=\"0\"");
  EXPECT_EQ(TextOf(*instances[1], "Version"), "NULL");
}

TEST_F(HostNamespaceTest, ADamagedTableStillFillsANamespace) {
  std::string const table = RealTable("full");
  for (std::size_t length = 0; length < table.size(); length += 7) {
    Fill(table.substr(0, length));
    EXPECT_EQ(InstancesOf("QRVSG_ComputerSystem").size(), 1u) << length;
  }
}

TEST_F(HostNamespaceTest, AHostNameThatIsNotSetIsMissingEverywhere) {
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", SamplePath().c_str());
  TEnvironmentGuard const name("ZEP_HOST_NAME", nullptr);
  TEnvironmentGuard const scsi("ZEP_SCSI_DEVICES", fScsiDevices.c_str());
  fNs = boost::make_shared<TMemoryNamespace>("root/test");
  bool isNameSet = false;
  std::thread([&] {  // only this thread gets the name
    isNameSet = ::unshare(CLONE_NEWUTS) == 0 && ::sethostname("(none)", 6) == 0;
    if (isNameSet) FillHostNamespace(*fNs);
  })
      .join();
  NEEDS(isNameSet, "only root may change the host name");

  std::string const reason = "placeholder text of the kernel: \"(none)\"; no host name is set";
  EXPECT_EQ(TextOfOnly("QRVSG_ComputerSystem", "Name"), "NULL");
  EXPECT_THAT(MissingOf("QRVSG_ComputerSystem"), testing::Contains("Name: " + reason));
  EXPECT_EQ(TextOfOnly("QRVSG_OperatingSystem", "CSName"), "NULL");
  EXPECT_THAT(MissingOf("QRVSG_OperatingSystem"), testing::Contains("CSName: " + reason));
  EXPECT_EQ(TextOf(*InstancesOf("CIM_Processor")[1], "SystemName"), "NULL");
}

// ---- Machines below ZEP_ROOT ----

class HostOfRootTest : public testing::Test {
protected:
  void Fill(std::string const& root) {
    TEnvironmentGuard const rootGuard("ZEP_ROOT", root.c_str());
    fNs = boost::make_shared<TMemoryNamespace>("root/test");
    FillHostNamespace(*fNs);
  }

  TEnvironmentGuard fNoTable{"ZEP_SMBIOS_TABLE", nullptr}, fUnnamed{"ZEP_HOST_NAME", nullptr},
      fNoScsi{"ZEP_SCSI_DEVICES", nullptr};
  boost::shared_ptr<TMemoryNamespace> fNs;
};

TEST_F(HostOfRootTest, AServerIsDescribedByItsFilesAlone) {
  TRecordedMachine const server("server");
  Fill(server.Root());
  ExpectTextOf(*fNs, "tests/providers/host/server.txt");
}

// A machine without files has reasons for everything, and the only values are those that the provider itself chooses.
TEST_F(HostOfRootTest, AMachineWithoutFilesHasReasons) {
  TTempDir const nothing;
  Fill(nothing.Path());
  ExpectTextOf(*fNs, "tests/providers/host/nothing.txt");
  TReasonReader const reasons(*fNs);
  EXPECT_EQ(reasons.WhyNoInstance("CIM_BIOSElement")->fReason, "the system exports no SMBIOS tables");
  EXPECT_EQ(reasons.WhyNoInstance("CIM_Processor")->fReason, "the system exports no SMBIOS tables");
  EXPECT_EQ(reasons.WhyNoInstance("CIM_ProcessorCore")->fReason, "/proc/cpuinfo does not exist");
  EXPECT_EQ(reasons.WhyNoInstance("ZEP_NUMANode")->fReason, "the kernel lists no NUMA nodes in /sys/devices/system/node");
}

// The time limit is generous, because other tests run at the same time.
TEST_F(HostOfRootTest, HundredsOfCpusAreDescribedQuickly) {
  TTempDir const root;
  TKernelTree(root.Path()).Sockets(2, 64, 2);
  auto const start = std::chrono::steady_clock::now();
  Fill(root.Path());
  std::chrono::duration<double, std::milli> const taken = std::chrono::steady_clock::now() - start;
  RecordProperty("milliseconds", std::to_string(taken.count()));
  EXPECT_LT(taken.count(), kIsSanitized ? 20000 : 2000);
  auto const count = [&](char const* className) {
    return All(*fNs->GetClass(className, kNone), &ICIMClass::EnumerateInstances).size();
  };
  EXPECT_EQ(count("CIM_Processor"), 2u);
  EXPECT_EQ(count("CIM_ProcessorCore"), 128u);
  EXPECT_EQ(count("CIM_Memory"), 1u + 3 * 128 + 2);
}

// ---- SCSI devices ----

TEST_F(HostNamespaceTest, ScsiDevicesAreThoseOfSysfs) {
  fScsiDevices = fDir.Path("scsi");
  TScsiDirectory(fScsiDevices).Add("1:0:0:0", "0", "Example ", "Virtual Disk    ", "0601");
  FillFromFile(SamplePath());
  EXPECT_EQ(TextOfOnly("QRVSG_SCSIDevice", "DeviceType"), "Direct Access Device");
  EXPECT_EQ(TextOfOnly("QRVSG_SCSIDevice", "DeviceID"), "1:0:0:0");
  EXPECT_EQ(TextOfOnly("QRVSG_SCSIDevice", "VendorID"), "Example");
  EXPECT_EQ(TextOfOnly("QRVSG_SCSIDevice", "ProductID"), "Virtual Disk");
  EXPECT_EQ(InstancesOf("QRVSG_SCSIDevice")[0]->GetPath(TCIMContext()).GetPath(),
            "QRVSG_SCSIDevice.CreationClassName=\"QRVSG_SCSIDevice\",DeviceID=\"1:0:0:0\","
            "SystemCreationClassName=\"QRVSG_ComputerSystem\",SystemName=\"db1\"");
  EXPECT_THAT(MissingOf("QRVSG_SCSIDevice"), IsEmpty());
}

TEST_F(HostNamespaceTest, WithoutScsiDevicesTheClassHasAReason) {
  FillFromFile(SamplePath());
  EXPECT_THAT(InstancesOf("QRVSG_SCSIDevice"), IsEmpty());
  EXPECT_THAT(MissingOf("QRVSG_SCSIDevice"),
              ElementsAre(": the kernel lists no SCSI devices: " + fScsiDevices + " does not exist"));
  fScsiDevices = fDir.Path("scsi");
  TScsiDirectory const empty(fScsiDevices);
  FillFromFile(SamplePath());
  EXPECT_THAT(MissingOf("QRVSG_SCSIDevice"), ElementsAre(": no SCSI devices are listed in " + fScsiDevices));
}

// ---- The plug-in ----

TEST_F(HostNamespaceTest, ThePlugInRegistersItselfAndReadsTheMachineAtTheFirstCall) {
  ASSERT_THAT(TOSSpecific::FindNSPs(), testing::Contains("Host"));
  TOSSpecific::LoadNSPLibrary("Host");
  auto const provider = TNamespaceProviderManager::GetInstance()->GetNamespaceProvider("Host");
  EXPECT_EQ(provider->GetName(TCIMContext()), "Host");

  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", RealTablePath("bare7").c_str());
  auto const ns = provider->GetNamespace(TCIMContext());
  EXPECT_EQ(ns->GetName(TCIMContext()), "root/zep/host");
  EXPECT_EQ(TCIMSchemaHelper::GetMTM(ns), "1234AB7");

  TEnvironmentGuard const otherTable("ZEP_SMBIOS_TABLE", RealTablePath("two-dashes").c_str());
  EXPECT_EQ(provider->GetNamespace(TCIMContext()), ns) << "the same namespace at each call";
  EXPECT_EQ(TCIMSchemaHelper::GetMTM(ns), "1234AB7");
}

}  // namespace
}  // namespace NQRVZEP20
