// SPDX-License-Identifier: Apache-2.0

// The namespace that the writer fills, in the form that a front end may rely on.

#include "providers/reasons/TRecordWriter.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TAddToVectorCallback.h"
#include "TMemoryNamespace.h"
#include "TZEPException.h"

#include <gmock/gmock.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TCIMContext const kNone;

class TRecordWriterTest : public testing::Test {
protected:
  static TRecord Disk(TCIMValue const& name, TFinding<std::string> const& model) {
    TRecord record("X_Disk", "sysfs");
    record.AddKey("Name", name);
    record.Add("Model", model);
    return record;
  }

  // Each instance as "path: value of each property".
  std::vector<std::string> InstancesOf(std::string const& className) const {
    std::vector<boost::shared_ptr<ICIMInstance>> instances;
    fNs->GetClass(className, kNone)->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), kNone);
    std::vector<std::string> texts;
    for (auto const& instance : instances) {
      std::string text = instance->GetPath(kNone).GetPath() + ":";
      instance->EnumerateProperties(
          [&](boost::shared_ptr<ICIMProperty> property) {
            TCIMValue const value = property->GetValue(kNone);
            text += " <" + (value.IsNull() ? "NULL" : value.ToString()) + ">";
            return true;
          },
          kNone);
      texts.push_back(text);
    }
    return texts;
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = boost::make_shared<TMemoryNamespace>("root/test");
  TRecordWriter fWriter{*fNs};
};

TMissing const kUnreadable{kMissingUnreadable, "the file cannot be read"};
TMissing const kNoDisks{kMissingNotGiven, "this machine has no disks"};

TEST_F(TRecordWriterTest, AClassIsDeclaredWithKeysTypesAndSources) {
  fWriter.Write(Disk("sda", std::string("Model 5")));
  auto const cls = fNs->GetClass("X_Disk", kNone);
  auto const name = cls->GetPropertyDecl("Name", kNone);
  EXPECT_TRUE(name->IsKey(kNone));
  EXPECT_FALSE(name->GetQualifier("ValueSource", kNone));
  auto const model = cls->GetPropertyDecl("Model", kNone);
  EXPECT_FALSE(model->IsKey(kNone));
  EXPECT_EQ(model->GetType(kNone), TCIMValue::TCIMType::kCIMTypeString);
  EXPECT_EQ(model->GetQualifier("ValueSource", kNone)->GetValue(kNone).ToString(), "sysfs");
}

TEST_F(TRecordWriterTest, EachMissingValueIsAnInstance) {
  fWriter.Write(Disk("", kUnreadable), {Disk("sda", std::string("Model 5")), Disk("sdb", kUnreadable)}, kNoDisks);
  fWriter.WriteMissing();
  EXPECT_THAT(InstancesOf("X_Disk"), ElementsAre("X_Disk.Name=\"sda\": <sda> <Model 5>", "X_Disk.Name=\"sdb\": <sdb> <NULL>"));
  EXPECT_THAT(InstancesOf("ZEP_MissingValue"),
              ElementsAre("ZEP_MissingValue.ElementPath=\"X_Disk.Name=\\\"sdb\\\"\",ElementProperty=\"Model\": "
                          "<X_Disk.Name=\"sdb\"> <Model> <unreadable> <the file cannot be read>"));
}

TEST_F(TRecordWriterTest, AClassWithoutInstancesHasAReason) {
  fWriter.Write(Disk("", kUnreadable), {}, kNoDisks);
  fWriter.WriteMissing();
  EXPECT_THAT(InstancesOf("X_Disk"), IsEmpty());
  EXPECT_THAT(InstancesOf("ZEP_MissingValue"), ElementsAre("ZEP_MissingValue.ElementPath=\"X_Disk\",ElementProperty=\"\": "
                                                           "<X_Disk> <> <not-given> <this machine has no disks>"));
}

TEST_F(TRecordWriterTest, AMissingValueOfAnotherInstanceMayBeAdded) {
  fNs->DefineClass("X_Fan").Key("Name", "string").Property("Speed", "uint32");
  auto const fan = fNs->AddInstance("X_Fan", {{"Name", "front"}});
  fWriter.AddMissing(fan->GetPath(kNone).GetPath(), "Speed", kUnreadable);
  fWriter.WriteMissing();
  EXPECT_THAT(InstancesOf("ZEP_MissingValue"),
              ElementsAre(testing::EndsWith("<X_Fan.Name=\"front\"> <Speed> <unreadable> <the file cannot be read>")));
}

TEST_F(TRecordWriterTest, ANamespaceWithoutMissingValuesHasTheClassAllTheSame) {
  fWriter.Write(Disk("sda", std::string("Model 5")));
  fWriter.WriteMissing();
  EXPECT_THAT(InstancesOf("ZEP_MissingValue"), IsEmpty());
}

TEST_F(TRecordWriterTest, AClassIsNotWrittenTwice) {
  fWriter.Write(Disk("sda", std::string("Model 5")));
  try {
    fWriter.Write(Disk("sdb", std::string("Model 5")));
    FAIL() << "nothing was thrown";
  } catch (TZEPException const& failure) {
    EXPECT_EQ(failure.GetStatusCode(), kZEPStatusAlreadyExists);
  }
}

// ---- Classes of the schema ----

class TSchemaRecordTest : public TRecordWriterTest {
protected:
  static TRecord Device(char const* className, std::string const& id) {
    TRecord record(className, "sysfs");
    record.AddKey("SystemName", "host");
    record.AddKey("DeviceID", id);
    record.Add("Capacity", TFinding<unsigned long>(5)).Unit("byte");
    return record;
  }
  static TRecord System() {
    TRecord record("CIM_ComputerSystem", "uname");
    record.AddKey("CreationClassName", "CIM_ComputerSystem");
    record.AddKey("Name", "host");
    return record;
  }

  // The class and its superclasses; the abstract ones in parentheses.
  std::vector<std::string> ChainOf(char const* className) const {
    std::vector<std::string> chain;
    for (auto cls = fNs->GetClass(className, kNone); cls; cls = cls->GetSuperClass(kNone)) {
      std::string const name = cls->GetName(kNone);
      chain.push_back(cls->IsAbstract(kNone) ? "(" + name + ")" : name);
    }
    return chain;
  }

  std::string QualifierOf(char const* className, char const* property, char const* qualifier) const {
    auto const found = fNs->GetClass(className, kNone)->GetPropertyDecl(property, kNone)->GetQualifier(qualifier, kNone);
    return found ? found->GetValue(kNone).ToString() : "none";
  }
};

TEST_F(TSchemaRecordTest, AClassIsBelowItsSuperclassesOfTheSchema) {
  fWriter.Write(Device("CIM_DiskDrive", "sda"));
  EXPECT_THAT(
      ChainOf("CIM_DiskDrive"),
      ElementsAre("CIM_DiskDrive", "CIM_MediaAccessDevice", "(CIM_LogicalDevice)", "(CIM_AllocatedLogicalElement)",
                  "(CIM_EnabledLogicalElement)", "(CIM_LogicalElement)", "(CIM_ManagedSystemElement)", "(CIM_ManagedElement)"));
}

TEST_F(TSchemaRecordTest, AnotherClassIsBelowTheSuperclassOfItsRecord) {
  TRecord record("X_Disk", "sysfs", "CIM_MediaAccessDevice");
  record.AddKey("DeviceID", "sda");
  fWriter.Write(record);
  EXPECT_THAT(ChainOf("X_Disk"), testing::Contains("(CIM_LogicalDevice)"));
}

TEST_F(TSchemaRecordTest, ASuperclassMayHaveRecordsOfItsOwn) {
  fWriter.Write(Device("CIM_PCIDevice", "00:01.0"));
  fWriter.Write(Device("CIM_PCIBridge", "00:02.0"));
  EXPECT_THAT(InstancesOf("CIM_PCIDevice"),
              ElementsAre(testing::StartsWith("CIM_PCIDevice"), testing::StartsWith("CIM_PCIBridge")));
  EXPECT_EQ(fNs->GetClass("CIM_PCIBridge", kNone)->GetPropertyDecl("DeviceID", kNone)->GetName(kNone), "DeviceID");
}

TEST_F(TSchemaRecordTest, RecordsMayFollowForAClassThatWasASuperclass) {
  fWriter.Write(Device("CIM_PCIBridge", "00:02.0"), {}, kNoDisks);
  fWriter.Write(Device("CIM_PCIDevice", "00:01.0"));
  EXPECT_THAT(InstancesOf("CIM_PCIDevice"), ElementsAre(testing::StartsWith("CIM_PCIDevice")));
}

TEST_F(TSchemaRecordTest, AUnitIsAQualifier) {
  fWriter.Write(Device("CIM_DiskDrive", "sda"));
  EXPECT_EQ(QualifierOf("CIM_DiskDrive", "Capacity", "PUnit"), "byte");
  EXPECT_EQ(QualifierOf("CIM_DiskDrive", "DeviceID", "PUnit"), "none");
}

TEST_F(TSchemaRecordTest, NamesOfValuesAreQualifiers) {
  static constexpr TValueName kStates[] = {{"2", "Enabled"}, {"3", "Disabled"}};
  TRecord record = Device("CIM_DiskDrive", "sda");
  record.Add("EnabledState", TFinding<unsigned short>(kUnreadable)).Names(kStates);
  fWriter.Write(record);
  EXPECT_EQ(QualifierOf("CIM_DiskDrive", "EnabledState", "ValueMap"), "{ 2, 3 }");
  EXPECT_EQ(QualifierOf("CIM_DiskDrive", "EnabledState", "Values"), "{ Enabled, Disabled }");
}

TEST_F(TSchemaRecordTest, AVectorIsAnArray) {
  TRecord record = Device("CIM_DiskDrive", "sda");
  record.Add("OperationalStatus", TFinding<std::vector<unsigned short>>(std::vector<unsigned short>{2, 5}));
  record.Add("Capabilities", TFinding<std::vector<unsigned short>>(kUnreadable));
  fWriter.Write(record);
  EXPECT_THAT(InstancesOf("CIM_DiskDrive"), ElementsAre(testing::EndsWith("<{ 2, 5 }> <NULL>")));
}

TEST_F(TSchemaRecordTest, InstancesAreAssociated) {
  TRecord const system = System(), disk = Device("CIM_DiskDrive", "sda"), fan = Device("CIM_Fan", "fan");
  fWriter.Write(system);
  fWriter.Write(disk);
  fWriter.Write(fan);
  fWriter.Associate(kSystemDevice, system, disk);
  fWriter.Associate(kSystemDevice, system, fan);
  EXPECT_THAT(ChainOf("CIM_SystemDevice"), ElementsAre("CIM_SystemDevice", "CIM_SystemComponent", "(CIM_Component)"));
  EXPECT_TRUE(fNs->GetClass("CIM_SystemDevice", kNone)->GetPropertyDecl("PartComponent", kNone)->IsKey(kNone));
  EXPECT_THAT(InstancesOf("CIM_SystemDevice"),
              ElementsAre(testing::AllOf(testing::HasSubstr("Name=\"host\""), testing::HasSubstr("DeviceID=\"sda\"")),
                          testing::HasSubstr("DeviceID=\"fan\"")));
}

TEST_F(TSchemaRecordTest, AnAssociationMayHaveProperties) {
  TRecord const hub = Device("CIM_USBHub", "usb1"), device = Device("CIM_USBDevice", "1-1");
  fWriter.Write(device);
  fWriter.Write(hub);
  TRecord connection("CIM_DeviceConnection", "sysfs");
  connection.Add("NegotiatedSpeed", TFinding<unsigned long>(480)).Unit("bit / second");
  connection.Add("NegotiatedDataWidth", TFinding<unsigned int>(kUnreadable));
  fWriter.Associate({"CIM_DeviceConnection", "Antecedent", "CIM_LogicalDevice", "Dependent", "CIM_LogicalDevice"}, hub, device,
                    connection);
  fWriter.WriteMissing();
  EXPECT_THAT(InstancesOf("CIM_DeviceConnection"), ElementsAre(testing::EndsWith(" <480> <NULL>")));
  EXPECT_EQ(QualifierOf("CIM_DeviceConnection", "NegotiatedSpeed", "PUnit"), "bit / second");
  EXPECT_THAT(InstancesOf("ZEP_MissingValue"), ElementsAre(testing::EndsWith("<unreadable> <the file cannot be read>")));
}

TEST_F(TSchemaRecordTest, OnlyWrittenRecordsAreAssociated) {
  fWriter.Write(System());
  fWriter.Write(Device("CIM_DiskDrive", "sda"));
  try {
    fWriter.Associate(kSystemDevice, System(), Device("CIM_DiskDrive", "sdb"));
    FAIL() << "nothing was thrown";
  } catch (TZEPException const& failure) {
    EXPECT_EQ(failure.GetStatusCode(), kZEPStatusNotFound);
  }
}

}  // namespace
}  // namespace NQRVZEP20
