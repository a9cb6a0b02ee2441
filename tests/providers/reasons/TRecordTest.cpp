// SPDX-License-Identifier: Apache-2.0
#include "providers/reasons/TRecord.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;

// "key name type value (source)", or "... NULL code: reason (source)".
std::vector<std::string> PropertiesOf(TRecord const& record) {
  std::vector<std::string> properties;
  for (TRecordProperty const& property : record.GetProperties()) {
    std::string text = (property.fIsKey ? "key " : "") + property.fName + " " + property.fValue.GetType().ToString() + " ";
    text += property.fValue.IsNull() ? "NULL " + property.fMissing.fCode + ": " + property.fMissing.fReason
                                     : property.fValue.ToString();
    properties.push_back(text + " (" + property.fSource + ")");
  }
  return properties;
}

TFinding<std::string> const kModel(std::string("Model 5"));
TMissing const kUnreadable{kMissingUnreadable, "the file cannot be read"};

TEST(TRecordTest, EachPropertyHasTheSourceThatWasSetBefore) {
  TRecord record("X_Disk", "sysfs");
  record.Add("Model", kModel);
  record.SetSource("firmware");
  record.Add("Serial", kModel);
  EXPECT_EQ(record.GetClassName(), "X_Disk");
  EXPECT_THAT(PropertiesOf(record), ElementsAre("Model string Model 5 (sysfs)", "Serial string Model 5 (firmware)"));
}

TEST(TRecordTest, AMissingValueIsNullOfThePropertysType) {
  TRecord record("X_Disk", "sysfs");
  record.Add("Model", TFinding<std::string>(kUnreadable));
  record.Add("Size", TFinding<std::uint64_t>(kUnreadable));
  record.Add("IsReady", TFinding<bool>(kUnreadable));
  EXPECT_THAT(PropertiesOf(record), ElementsAre("Model string NULL unreadable: the file cannot be read (sysfs)",
                                                "Size uint64 NULL unreadable: the file cannot be read (sysfs)",
                                                "IsReady boolean NULL unreadable: the file cannot be read (sysfs)"));
}

TEST(TRecordTest, ANumberMayBeALongLong) {
  TRecord record("X_Disk", "sysfs");
  record.AddKey("Id", TFinding<unsigned long long>(7ULL));
  record.Add("Offset", TFinding<long long>(-5LL));
  record.Add("Size", TFinding<unsigned long long>(kUnreadable));
  EXPECT_THAT(PropertiesOf(record), ElementsAre("key Id uint64 7 (sysfs)", "Offset sint64 -5 (sysfs)",
                                                "Size uint64 NULL unreadable: the file cannot be read (sysfs)"));
}

TEST(TRecordTest, AKeyThatTheProviderChoosesHasNoSource) {
  TRecord record("X_Disk", "sysfs");
  record.AddKey("Name", "sda");
  EXPECT_THAT(PropertiesOf(record), ElementsAre("key Name string sda ()"));
}

TEST(TRecordTest, AKeyFromTheSourceMayBeMissing) {
  TRecord record("X_Disk", "sysfs");
  record.AddKey("Model", kModel);
  record.AddKey("Serial", TFinding<std::string>(kUnreadable));
  EXPECT_THAT(PropertiesOf(record), ElementsAre("key Model string Model 5 (sysfs)",
                                                "key Serial string NULL unreadable: the file cannot be read (sysfs)"));
}

TEST(TRecordTest, APropagatedKeyHasNoSource) {
  TRecord record("X_Disk", "sysfs");
  record.AddPropagatedKey("SystemName", TFinding<std::string>(std::string("db1")));
  record.AddPropagatedKey("SystemId", TFinding<std::string>(kUnreadable));
  EXPECT_THAT(PropertiesOf(record),
              ElementsAre("key SystemName string db1 ()", "key SystemId string NULL unreadable: the file cannot be read ()"));
}

}  // namespace
}  // namespace NQRVZEP20
