// SPDX-License-Identifier: Apache-2.0
#include "collect/Report.h"

#include "TMemoryInstance.h"
#include "TMemoryNamespace.h"
#include "TZEPException.h"
#include "tests/Support.h"
#include "tests/collect/SamplePlugIns.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

TPlugIn PlugInWith(boost::shared_ptr<ICIMNamespace> ns) {
  return {"Test", "libTest.nsp.so", 0, "", {{"Test", std::make_shared<TNamespaceView>("Test", ns), 0, ""}}};
}

TReportAnswer AnswerOf(TReport const& report, std::string const& key) {
  TReportRow const* const row = report.FindRow(key);
  if (row == nullptr) throw std::out_of_range(key);
  return row->fAnswer;
}

template <class T>
T ValueOf(TReport const& report, std::string const& key) {
  return std::get<T>(AnswerOf(report, key).fValue.value());
}

// ---- The sample ----

TEST(ReportTest, TheSampleMakesACompleteReportWithTypedValues) {
  TReport const report = MakeReport(SamplePlugIns(), TheSample());
  EXPECT_EQ(report.fCompleteness, ECompleteness::kComplete);
  EXPECT_EQ(ValueOf<std::string>(report, "hostName"), "sample-server");
  EXPECT_EQ(ValueOf<std::string>(report, "serialNumber"), "KQ12345");
  EXPECT_EQ(AnswerOf(report, "serialNumber").fSource, "SAMPLE, SMBIOS type 1");
  auto const memory = ValueOf<TMemorySize>(report, "memory");
  EXPECT_EQ(memory.fBytes, std::uint64_t{128} << 30);
  EXPECT_EQ(memory.fModules, 8u);
  EXPECT_EQ(memory.fUnknownModules, 0u);
}

TEST(ReportTest, TheTableFileIsReportedUnlessThereIsASample) {
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", "/callers/table");
  EXPECT_EQ(MakeReport({}).fTableFile, "/callers/table");
  EXPECT_FALSE(MakeReport({}).fSample);
  TReport const report = MakeReport({}, TheSample());
  EXPECT_EQ(report.fTableFile, "");
  EXPECT_EQ(report.fSample.value().fLabel, "SAMPLE");
}

// ---- Values ----

class HardwareTest : public testing::Test {
protected:
  HardwareTest() {
    fNamespace->DefineClass("CIM_Processor")
        .Key("DeviceID", "string")
        .Property("ElementName", "string")
        .Property("NumberOfEnabledCores", "uint16");
    fNamespace->DefineClass("CIM_PhysicalMemory").Key("Tag", "string").Property("Capacity", "uint64");
    fNamespace->DefineClass("CIM_BIOSElement").Key("Name", "string").Property("ReleaseDate", "datetime");
  }

  void AddProcessor(char const* id, TCIMValue const& kind, TCIMValue const& cores) {
    fNamespace->AddInstance("CIM_Processor", {{"DeviceID", id}, {"ElementName", kind}, {"NumberOfEnabledCores", cores}});
  }
  TReport Report() const { return MakeReport({PlugInWith(fNamespace)}); }

  TCIMValue const fNoText = TCIMValue(TCIMValue::TCIMType::kCIMTypeString, 0);
  TCIMValue const fNoNumber = TCIMValue(TCIMValue::TCIMType::kCIMTypeUint16, 0);
  boost::shared_ptr<TMemoryNamespace> const fNamespace = boost::make_shared<TMemoryNamespace>("root/test");
};

TCIMValue Cores(int count) { return TCIMValue(static_cast<unsigned short>(count)); }

TEST_F(HardwareTest, ProcessorsAreCountedByKind) {
  AddProcessor("0", "Kind B", Cores(4));
  AddProcessor("1", "Kind A", Cores(12));
  AddProcessor("2", "Kind A", Cores(10));
  auto const kinds = ValueOf<std::vector<TProcessorKind>>(Report(), "processors");
  ASSERT_EQ(kinds.size(), 2u);
  EXPECT_EQ(kinds[0].fKind, "Kind A");
  EXPECT_EQ(kinds[0].fCount, 2u);
  EXPECT_EQ(kinds[0].fCores, 22u);
  EXPECT_EQ(kinds[1].fKind, "Kind B");
  EXPECT_EQ(kinds[1].fCount, 1u);
  EXPECT_EQ(kinds[1].fCores, 4u);
}

TEST_F(HardwareTest, UnknownKindsAndCoresStayUnknown) {
  AddProcessor("0", "Kind A", Cores(4));
  AddProcessor("1", "Kind A", fNoNumber);
  AddProcessor("2", fNoText, Cores(8));
  auto const kinds = ValueOf<std::vector<TProcessorKind>>(Report(), "processors");
  ASSERT_EQ(kinds.size(), 2u);
  EXPECT_EQ(kinds[0].fKind, "");
  EXPECT_EQ(kinds[0].fCores, 8u);
  EXPECT_EQ(kinds[1].fCount, 2u);
  EXPECT_FALSE(kinds[1].fCores);
}

TEST_F(HardwareTest, MemoryIsInBytesAndModules) {
  fNamespace->AddInstance("CIM_PhysicalMemory", {{"Tag", "0"}, {"Capacity", 536870912ul}});
  fNamespace->AddInstance("CIM_PhysicalMemory", {{"Tag", "1"}});
  auto const size = ValueOf<TMemorySize>(Report(), "memory");
  EXPECT_EQ(size.fBytes, 536870912u);
  EXPECT_EQ(size.fModules, 2u);
  EXPECT_EQ(size.fUnknownModules, 1u);
}

TEST_F(HardwareTest, WithoutModulesTheMemoryIsThatOfTheKernel) {
  fNamespace->DefineClass("CIM_Memory")
      .Key("DeviceID", "string")
      .Property("BlockSize", "uint64")
      .Property("NumberOfBlocks", "uint64");
  fNamespace->AddInstance("CIM_Memory", {{"DeviceID", "L1d 0 cache"}, {"BlockSize", 1ul}, {"NumberOfBlocks", 32768ul}});
  fNamespace->AddInstance("CIM_Memory", {{"DeviceID", "Main memory"}, {"BlockSize", 1024ul}, {"NumberOfBlocks", 4096ul}});
  auto const size = ValueOf<TMemorySize>(Report(), "memory");
  EXPECT_EQ(size.fBytes, 4194304u);
  EXPECT_EQ(size.fModules, 0u);
}

TEST_F(HardwareTest, MemoryOfUnknownSizeIsMissing) {
  fNamespace->AddInstance("CIM_PhysicalMemory", {{"Tag", "0"}});
  EXPECT_EQ(AnswerOf(Report(), "memory").fMissing.fReason, "the provider gives no value");
}

TEST_F(HardwareTest, TheBiosDateIsADate) {
  fNamespace->AddInstance("CIM_BIOSElement", {{"Name", "BIOS"}, {"ReleaseDate", TCIMDateTime("20240309000000.000000+000")}});
  auto const date = ValueOf<TDate>(Report(), "biosDate");
  EXPECT_EQ(date.fYear, 2024u);
  EXPECT_EQ(date.fMonth, 3u);
  EXPECT_EQ(date.fDay, 9u);
}

// ---- Completeness and failures ----

TEST(ReportTest, WithoutPlugInsNothingIsKnown) {
  TReport const report = MakeReport({});
  EXPECT_EQ(report.fCompleteness, ECompleteness::kNothing);
  EXPECT_EQ(AnswerOf(report, "serialNumber").fMissing.fCode, "not-described");
  EXPECT_EQ(AnswerOf(report, "memory").fMissing.fReason, "no provider plug-in found");
  EXPECT_EQ(report.FindRow("colour"), nullptr);
}

TEST(ReportTest, AFailedPlugInMakesACompleteIdentityPartial) {
  auto plugIns = SamplePlugIns();
  plugIns.push_back({"Broken", "libBroken.nsp.so", 0, "file too short", {}});
  EXPECT_EQ(MakeReport(plugIns, TheSample()).fCompleteness, ECompleteness::kPartial);
}

// Throws for every class but the one with the reasons.
class TFailingNamespace : public TMemoryNamespace {
public:
  using TMemoryNamespace::TMemoryNamespace;
  boost::shared_ptr<ICIMClass> GetClass(std::string const& name, TCIMContext const& context) const override {
    if (name == "ZEP_MissingValue") return TMemoryNamespace::GetClass(name, context);
    throw 5;
  }
};

TEST(ReportTest, AProviderThatThrowsIsAReason) {
  TReport const report = MakeReport({PlugInWith(boost::make_shared<TFailingNamespace>("root/test"))});
  EXPECT_EQ(report.fCompleteness, ECompleteness::kNothing);
  for (auto const* rows : {&report.fIdentity, &report.fDetails})
    for (TReportRow const& row : *rows) {
      EXPECT_EQ(row.fAnswer.fMissing.fCode, "provider-failed") << row.fKey;
      EXPECT_EQ(row.fAnswer.fMissing.fReason, "provider Test failed: it threw an object that is not a std::exception");
    }
}

}  // namespace
}  // namespace NQRVZEP20
