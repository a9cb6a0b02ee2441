// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/check/Rules.h"

#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

using TType = TCIMValue::TCIMType;

// One instance of X_Disk, which declares Name and Size.
TRuleResult CheckedWith(std::vector<TPropertyContent> const& properties, std::string const& className = "x_disk") {
  TObservation observation;
  TContent content{"Disks", "root/disks", {}, {}, {}};
  content.fClasses.push_back(
      {"X_Disk", {}, {{"Name", TType::kCIMTypeString, true}, {"Size", TType::kCIMTypeUint64, false}}, false, {}});
  content.fInstances.push_back({className, "root/disks:X_Disk.Name=\"sda\"", true, properties});
  observation.fFirst.fContents.push_back(content);
  TRuleResult result("types");
  CheckTypes(observation, result);
  return result;
}

TEST(TypeRuleTest, ValuesOfTheDeclaredTypesPass) {
  EXPECT_EQ(CheckedWith({{"name", TCIMValue("sda"), true}, {"Size", TCIMValue(std::uint64_t{5}), false}}).Status(), "passed");
  EXPECT_EQ(CheckedWith({{"Size", TCIMValue(), false}}).Status(), "passed") << "NULL";
}

TEST(TypeRuleTest, AValueOfAnotherTypeIsFound) {
  TRuleResult const result = CheckedWith({{"Name", TCIMValue("sda"), true}, {"Size", TCIMValue("5"), false}});
  ASSERT_EQ(result.NumberFound(), 1u);
  EXPECT_EQ(result.Findings()[0].fPlace, "root/disks:X_Disk.Name=\"sda\".Size");
  EXPECT_EQ(result.Findings()[0].fText, "the type of its value is string, and its class declares uint64");
}

TEST(TypeRuleTest, APropertyOrClassThatIsNotDeclaredIsFound) {
  TRuleResult const result = CheckedWith({{"Model", TCIMValue("x"), false}});
  ASSERT_EQ(result.NumberFound(), 1u);
  EXPECT_EQ(result.Findings()[0].fText, "its class X_Disk does not declare this property");
  TRuleResult const ofNoClass = CheckedWith({}, "X_Tape");
  ASSERT_EQ(ofNoClass.NumberFound(), 1u);
  EXPECT_EQ(ofNoClass.Findings()[0].fText, "the namespace does not have its class X_Tape");
}

TEST(TypeRuleTest, WithoutANamespaceItIsNotChecked) {
  TObservation const nothing{};
  TRuleResult result("types");
  CheckTypes(nothing, result);
  EXPECT_EQ(result.Status(), "not-checked");
}

}  // namespace
}  // namespace NQRVZEP20::zep
