// SPDX-License-Identifier: Apache-2.0
#include "providers/reasons/TReasonReader.h"

#include "ICIMClass.h"
#include "ICIMPropertyDecl.h"
#include "TMemoryNamespace.h"
#include "TZEPException.h"
#include "providers/reasons/TRecordWriter.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

TCIMContext const kNone;

std::string TextOf(std::optional<TMissing> const& why) { return why ? why->fCode + ": " + why->fReason : "none"; }

class TReasonReaderTest : public testing::Test {
protected:
  // A class of disks, in the form that any provider may write without the writer of this room.
  TReasonReaderTest() {
    fNs->DefineClass("X_Disk").Key("Name", "string").Property("Model", "string").Property("Size", "uint64");
    fDisk = fNs->AddInstance("X_Disk", {{"Name", "sd \"a\""}});
  }

  void DefineMissingValues() {
    fNs->DefineClass("ZEP_MissingValue")
        .Key("ElementPath", "string")
        .Key("ElementProperty", "string")
        .Property("Code", "string")
        .Property("Reason", "string");
  }
  void AddMissing(TMemoryValues const& values) { fNs->AddInstance("ZEP_MissingValue", values); }

  boost::shared_ptr<TMemoryNamespace> const fNs = boost::make_shared<TMemoryNamespace>("root/test");
  boost::shared_ptr<TMemoryInstance> fDisk;
};

TEST_F(TReasonReaderTest, ReasonsOfInstancesAndClassesAreRead) {
  DefineMissingValues();
  std::string const path = fDisk->GetPath(kNone).GetPath();
  AddMissing({{"ElementPath", path}, {"ElementProperty", "Model"}, {"Code", "needs-root"}, {"Reason", "needs root"}});
  AddMissing({{"ElementPath", "X_Fan"}, {"ElementProperty", ""}, {"Code", "not-given"}, {"Reason", "no fans"}});
  TReasonReader const reasons(*fNs);
  EXPECT_EQ(TextOf(reasons.WhyMissing(*fDisk, "Model")), "needs-root: needs root");
  EXPECT_EQ(TextOf(reasons.WhyMissing(*fDisk, "Size")), "none");
  EXPECT_EQ(TextOf(reasons.WhyNoInstance("X_Fan")), "not-given: no fans");
  EXPECT_EQ(TextOf(reasons.WhyNoInstance("X_Disk")), "none");
}

TEST_F(TReasonReaderTest, CaseOfNamesDoesNotMatter) {
  DefineMissingValues();
  AddMissing({{"ElementPath", fDisk->GetPath(kNone).GetPath()}, {"ElementProperty", "MODEL"}, {"Code", "own-code"}});
  AddMissing({{"ElementPath", "x_fan"}, {"ElementProperty", ""}, {"Code", "not-given"}});
  TReasonReader const reasons(*fNs);
  EXPECT_EQ(TextOf(reasons.WhyMissing(*fDisk, "model")), "own-code: ");
  EXPECT_EQ(TextOf(reasons.WhyNoInstance("X_Fan")), "not-given: ");
}

TEST_F(TReasonReaderTest, AMissingPropertyNameMeansTheClass) {
  DefineMissingValues();
  AddMissing({{"ElementPath", "X_Fan"}, {"Code", "not-given"}, {"Reason", "no fans"}});
  EXPECT_EQ(TextOf(TReasonReader(*fNs).WhyNoInstance("X_Fan")), "not-given: no fans");
}

TEST_F(TReasonReaderTest, ANamespaceWithoutTheClassStatesNoReasons) {
  TReasonReader const reasons(*fNs);
  EXPECT_EQ(TextOf(reasons.WhyMissing(*fDisk, "Model")), "none");
  EXPECT_EQ(TextOf(reasons.WhyNoInstance("X_Disk")), "none");
}

TEST_F(TReasonReaderTest, AClassOfAnotherShapeIsNoFailure) {
  fNs->DefineClass("ZEP_MissingValue").Key("ElementPath", "uint8").Property("Code", "boolean");
  AddMissing({{"ElementPath", 7}, {"Code", true}});
  EXPECT_EQ(TextOf(TReasonReader(*fNs).WhyNoInstance("7")), "true: ");
}

TEST_F(TReasonReaderTest, AFailureOfTheNamespacePassesOn) {
  class TFailing : public TMemoryNamespace {
  public:
    using TMemoryNamespace::TMemoryNamespace;
    boost::shared_ptr<ICIMClass> GetClass(std::string const&, TCIMContext const&) const override {
      throw TZEPException(kZEPStatusAccessDenied);
    }
  };
  try {
    TReasonReader const reasons(*boost::make_shared<TFailing>("root/failing"));
    FAIL() << "nothing was thrown";
  } catch (TZEPException const& failure) {
    EXPECT_EQ(failure.GetStatusCode(), kZEPStatusAccessDenied);
  }
}

TEST_F(TReasonReaderTest, TheSourceIsTheQualifierOfTheProperty) {
  fNs->CreateQualifierDecl("ValueSource", TMemoryType("string").GetNull(), 0, 0, kNone);
  fNs->DefineClass("X_Fan")
      .Property("Speed", "uint32")
      .Qualifier("ValueSource", "sensor 7")
      .Property("Name", "string")
      .Property("Slot", "string")
      .Qualifier("ValueSource", TMemoryType("string").GetNull());
  auto const cls = fNs->GetClass("X_Fan", kNone);
  auto const sourceOf = [&](char const* property) {
    return TReasonReader::SourceOf(*cls->GetPropertyDecl(property, kNone)).value_or("none");
  };
  EXPECT_EQ(sourceOf("Speed"), "sensor 7");
  EXPECT_EQ(sourceOf("Name"), "none");
  EXPECT_EQ(sourceOf("Slot"), "none");
}

TEST_F(TReasonReaderTest, TheReaderFindsAllThatTheWriterWrote) {
  TRecordWriter writer(*fNs);
  TRecord fan("X_Fan", "sensor 7");
  fan.AddKey("Name", "front");
  fan.Add("Speed", TFinding<unsigned>(TMissing{kMissingUnexpected, "\"-1\" is not a speed"}));
  TRecord const pump("X_Pump", "");
  writer.Write(fan);
  writer.Write(pump, {}, {kMissingNotApplicable, "cooled by air"});
  writer.WriteMissing();

  TReasonReader const reasons(*fNs);
  auto const instance = fNs->GetInstance(TCIMReference(fNs, "root/test:X_Fan.Name=\"front\"", kNone), kNone);
  ASSERT_TRUE(instance);
  EXPECT_EQ(TextOf(reasons.WhyMissing(*instance, "Speed")), "unexpected-form: \"-1\" is not a speed");
  EXPECT_EQ(TextOf(reasons.WhyNoInstance("X_Pump")), "not-applicable: cooled by air");
  EXPECT_EQ(TReasonReader::SourceOf(*fNs->GetClass("X_Fan", kNone)->GetPropertyDecl("Speed", kNone)), "sensor 7");
}

}  // namespace
}  // namespace NQRVZEP20
