// SPDX-License-Identifier: Apache-2.0
#include "collect/TNamespaceView.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMPropertyDecl.h"
#include "TMemoryInstance.h"
#include "TMemoryNamespace.h"
#include "TRecordWriter.h"
#include "tests/Support.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

#include <ctime>

namespace NQRVZEP20 {
namespace {

class TNamespaceViewTest : public testing::Test {
protected:
  // Two disks, of which the second has no size; no batteries.
  TNamespaceViewTest() {
    TRecordWriter writer(*fNamespace);
    TRecord first("X_Disk", "sysfs (file)"), second("X_Disk", "sysfs (file)"), battery("X_Battery", "sysfs (file)");
    first.AddKey("Name", "sda");
    first.Add("Bytes", TFinding<unsigned long>(4096ul));
    second.AddKey("Name", "sdb");
    second.Add("Bytes", TFinding<unsigned long>(TMissing{"unreadable", "the kernel gives no size"}));
    battery.AddKey("Name", "");
    battery.Add("Charge", TFinding<unsigned char>(TMissing{}));
    writer.Write(first, {first, second}, {});
    writer.Write(battery, {}, {"not-given", "this machine has no batteries"});
    writer.WriteMissing();
    fNamespace->DefineClass("X_Note").Property("Text", "string");
  }

  TNamespaceView View(std::string const& label = "") const { return TNamespaceView("Test", fNamespace, label); }

  boost::shared_ptr<TMemoryNamespace> const fNamespace = boost::make_shared<TMemoryNamespace>("root/test");
};

TEST_F(TNamespaceViewTest, ANumberStaysANumber) {
  TNamespaceView const view = View();
  auto const answer = view.Answer(*view.InstancesOf("X_Disk").front(), "Bytes");
  ASSERT_TRUE(answer.IsKnown());
  EXPECT_EQ(static_cast<unsigned long>(*answer.fValue), 4096u);
  EXPECT_EQ(answer.fSource, "sysfs (file)");
  EXPECT_EQ(*view.AnswerOfFirst("X_Disk", "Bytes").fValue, *answer.fValue);
}

TEST_F(TNamespaceViewTest, AMissingValueHasTheReasonOfTheProvider) {
  TNamespaceView const view = View();
  auto const answer = view.Answer(*view.InstancesOf("X_Disk").back(), "Bytes");
  EXPECT_FALSE(answer.IsKnown());
  EXPECT_EQ(answer.fMissing.fCode, "unreadable");
  EXPECT_EQ(answer.fMissing.fReason, "the kernel gives no size");
  EXPECT_EQ(answer.fSource, "sysfs (file)");
}

TEST_F(TNamespaceViewTest, AClassWithoutInstancesHasTheReasonOfTheProvider) {
  auto const answer = View().AnswerOfFirst("X_Battery", "Charge");
  EXPECT_FALSE(answer.IsKnown());
  EXPECT_EQ(answer.fMissing.fReason, "this machine has no batteries");
  EXPECT_EQ(answer.fSource, "sysfs (file)");
}

TEST_F(TNamespaceViewTest, WithoutAReasonTheReasonIsGeneral) {
  struct TRow {
    TAnswer<TCIMValue> fAnswer;
    char const *fCode, *fReason;
  };
  TNamespaceView const view = View();
  auto const note = fNamespace->AddInstance("X_Note", {});
  for (TRow const& row : {TRow{view.AnswerOfFirst("X_None", "Text"), "not-described", "no provider describes it"},
                          TRow{view.Answer(*note, "Text"), "not-given", "the provider gives no value"},
                          TRow{view.Answer(*note, "Colour"), "not-given", "the provider has no property Colour"}}) {
    EXPECT_FALSE(row.fAnswer.IsKnown());
    EXPECT_EQ(row.fAnswer.fMissing.fCode, row.fCode);
    EXPECT_EQ(row.fAnswer.fMissing.fReason, row.fReason);
  }
}

TEST_F(TNamespaceViewTest, SourcesHaveTheLabelOfTheSample) {
  EXPECT_EQ(View().AnswerOfFirst("X_Disk", "Bytes").fSource, "sysfs (file)");
  EXPECT_EQ(View("SAMPLE").AnswerOfFirst("X_Disk", "Bytes").fSource, "SAMPLE, sysfs");
  EXPECT_EQ(View("SAMPLE").GetSampleLabel(), "SAMPLE");
}

TEST_F(TNamespaceViewTest, ThePathsOfInstancesWithoutKeysAreNumbered) {
  TNamespaceView const view = View();
  auto const first = fNamespace->AddInstance("X_Note", {{"Text", "first"}});
  auto const second = fNamespace->AddInstance("X_Note", {{"Text", "second"}});
  EXPECT_EQ(view.PathOf(*first), "root/test:X_Note#1");
  EXPECT_EQ(view.PathOf(*second), "root/test:X_Note#2");
  EXPECT_EQ(view.PathOf(*view.InstancesOf("X_Disk").front()), "root/test:X_Disk.Name=\"sda\"");
}

TEST_F(TNamespaceViewTest, APathIsUtf8) {
  fNamespace->DefineClass("X_Bytes").Key("Id", "string");
  EXPECT_EQ(View().PathOf(*fNamespace->AddInstance("X_Bytes", {{"Id", "\xff"}})), "root/test:X_Bytes.Id=\"\\xff\"");
}

TEST_F(TNamespaceViewTest, AClassThatIsMissingIsNotLookedForAgain) {
  TNamespaceView const view = View();
  EXPECT_FALSE(view.FindClass("X_Late"));
  fNamespace->DefineClass("X_Late");
  EXPECT_FALSE(view.FindClass("X_Late"));
  EXPECT_TRUE(View().FindClass("X_Late"));
}

TEST_F(TNamespaceViewTest, AClassThatIsMissingHasNoInstances) {
  EXPECT_FALSE(View().FindClass("X_None"));
  EXPECT_TRUE(View().InstancesOf("X_None").empty());
  EXPECT_EQ(View().AllInstances().size(), 4u);  // two disks, and two reasons
}

// This takes minutes when each one is searched among all.
TEST(TNamespaceViewPathsTest, ManyInstancesWithoutKeysAreNumberedSoon) {
  constexpr std::size_t kCount = kIsSanitized ? 20'000 : 200'000;
  auto const ns = boost::make_shared<TMemoryNamespace>("root/plain");
  ns->DefineClass("X_Plain").Property("Text", "string");
  for (std::size_t n = 0; n < kCount; ++n) ns->AddInstance("X_Plain", {});
  std::clock_t const begin = std::clock();
  TNamespaceView const view("Plain", ns);
  std::size_t number = 0;
  for (auto const& instance : view.AllInstances())
    ASSERT_EQ(view.PathOf(*instance), "root/plain:X_Plain#" + std::to_string(++number));
  EXPECT_EQ(number, kCount);
  EXPECT_LT((std::clock() - begin) / CLOCKS_PER_SEC, 8);
}

}  // namespace
}  // namespace NQRVZEP20
