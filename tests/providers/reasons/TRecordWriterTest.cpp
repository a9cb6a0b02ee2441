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

}  // namespace
}  // namespace NQRVZEP20
