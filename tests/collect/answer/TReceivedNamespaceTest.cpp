// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedNamespace.h"

#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TBadAnswer.h"
#include "tests/Support.h"
#include "tests/collect/SamplePlugIns.h"
#include "tests/collect/answer/Bytes.h"
#include "tests/collect/answer/DumpOf.h"
#include "tests/collect/answer/RandomNamespace.h"

#include <boost/make_shared.hpp>

#include <random>

namespace NQRVZEP20 {
namespace {

TCIMContext const kNone;

boost::shared_ptr<TMemoryNamespace> Disks() {
  auto const ns = boost::make_shared<TMemoryNamespace>("root/disks");
  ns->DefineClass("X_Device").Key("Id", "uint32").Property("Name", "string");
  ns->DefineClass("X_Disk", "X_Device").Property("Size", "uint64").Method("Reset", "uint32").In("Force", "boolean");
  ns->AddInstance("X_Device", {{"Id", 1}, {"Name", "fan"}});
  ns->AddInstance("X_Disk", {{"Id", 2}, {"Name", "sda"}});
  return ns;
}

TEST(TReceivedNamespaceTest, InstancesAreFoundByTheirPaths) {
  auto const ns = TReceivedNamespace::From(BytesOf(*Disks()));
  TCIMReference const path(ns, "root/disks:X_Disk.Id=\"2\"", kNone);
  auto const disk = boost::dynamic_pointer_cast<ICIMInstance>(path.GetCIMElement(false));
  ASSERT_TRUE(disk);
  EXPECT_EQ(disk->GetProperty("name", kNone)->GetValue(kNone), TCIMValue("sda"));
  EXPECT_FALSE(ns->GetInstance(TCIMReference(ns, "root/disks:X_Device.Id=\"2\"", kNone), kNone));
  EXPECT_FALSE(ns->GetInstance(TCIMReference(ns, "root/disks:X_Disk", kNone), kNone));
}

TEST(TReceivedNamespaceTest, ItDoesNotChange) {
  auto const ns = TReceivedNamespace::From(BytesOf(*Disks()));
  auto const disk = ns->GetClass("X_Disk", kNone);
  EXPECT_STATUS(ns->CreateClass({}, "X_New", kNone), kZEPStatusNotSupported);
  EXPECT_STATUS(ns->CreateQualifierDecl("New", TCIMValue(true), 0, 0, kNone), kZEPStatusNotSupported);
  EXPECT_STATUS(disk->AddPropertyDecl("New", TCIMValue(true), kNone), kZEPStatusNotSupported);
  EXPECT_STATUS(disk->CreateInstance(kNone), kZEPStatusNotSupported);
  EXPECT_STATUS(disk->AddQualifier({}, TCIMValue(true), 0, kNone), kZEPStatusNotSupported);
  disk->EnumerateMethodDecls(
      [](boost::shared_ptr<ICIMMethodDecl> method) {
        EXPECT_STATUS(method->AddParameterDecl("New", TCIMValue::TCIMType::kCIMTypeUint8, 0, "", kNone), kZEPStatusNotSupported);
        return true;
      },
      kNone);
  disk->EnumerateInstances(
      [](boost::shared_ptr<ICIMInstance> instance) {
        EXPECT_STATUS(instance->GetProperty("Name", kNone)->SetValue("sdb", kNone), kZEPStatusNotSupported);
        return true;
      },
      kNone);
}

TEST(TReceivedNamespaceTest, ElementsThatOutliveItThrow) {
  auto ns = TReceivedNamespace::From(BytesOf(*Disks()));
  auto const disk = ns->GetClass("X_Disk", kNone);
  boost::shared_ptr<ICIMInstance> instance;
  disk->EnumerateInstances([&](boost::shared_ptr<ICIMInstance> visited) { return (instance = visited), true; }, kNone);
  auto const property = instance->GetProperty("Name", kNone);
  ns.reset();
  EXPECT_THROW(disk->GetNamespace(kNone), boost::bad_weak_ptr);
  EXPECT_THROW(instance->GetPath(kNone), boost::bad_weak_ptr);
  EXPECT_THROW(instance->GetProperty("Name", kNone), boost::bad_weak_ptr);
  EXPECT_THROW(property->GetValue(kNone), boost::bad_weak_ptr);
}

// ---- Bytes that no writer writes ----

// Either they are refused, or every operation returns or throws an exception.
bool IsRefused(std::string const& bytes) {
  try {
    auto const ns = TReceivedNamespace::From(bytes);
    EXPECT_FALSE(DumpOf(*ns).empty());
    return false;
  } catch (TBadAnswer const&) {
    return true;
  } catch (std::exception const&) {
    return false;  // of an operation
  }
}

TEST(TReceivedNamespaceTest, BytesThatAreCutOffAreRefused) {
  for (unsigned int const seed : {1u, 2u, 3u}) {
    std::string const bytes = BytesOf(*RandomNamespace(seed));
    std::size_t const step = bytes.size() / 500 + 1;
    for (std::size_t size = 0; size < bytes.size(); size += step) EXPECT_TRUE(IsRefused(bytes.substr(0, size))) << size;
    EXPECT_TRUE(IsRefused(bytes + '\0'));
    EXPECT_FALSE(IsRefused(bytes));
  }
}

TEST(TReceivedNamespaceTest, FlippedBitsDoNoHarm) {
  OnNewThread([] {  // whose log is silent: references with wrong keys are logged
    TLogger::SetLogThreshold(static_cast<ILogger::EZEPLogSeverity>(-1));
    std::mt19937 engine(42);
    int refused = 0, accepted = 0;
    std::vector<std::string> answers = {BytesOf(*Disks())};
    for (TNamespaceView const& view : ViewsOf(SamplePlugIns())) answers.push_back(BytesOf(*view.Get()));
    for (unsigned int seed = 0; seed < 10; ++seed) answers.push_back(BytesOf(*RandomNamespace(seed)));
    for (std::string const& answer : answers)
      for (int n = 0; n < (kIsSanitized ? 10 : 60); ++n) {
        std::string bytes = answer;
        for (unsigned int flips = 1 + engine() % 4; flips > 0; --flips)
          bytes[engine() % bytes.size()] ^= static_cast<char>(1u << engine() % 8);
        ++(IsRefused(bytes) ? refused : accepted);
      }
    EXPECT_GT(refused, 10);
    EXPECT_GT(accepted, 10);
    TLogger::SetLogThreshold(ILogger::kLogStatus);
  });
}

std::string Head(std::uint64_t classes) {
  TByteWriter writer;
  writer.Text(kNamespaceForm);
  writer.Number(kNamespaceVersion);
  writer.Text("root/x");
  writer.Number(classes);
  return writer.Bytes();
}

std::string WhyRefused(std::string const& bytes) {
  try {
    TReceivedNamespace::From(bytes);
  } catch (TBadAnswer const& refusal) {
    return refusal.what();
  }
  return "";
}

TEST(TReceivedNamespaceTest, CountsAboveWhatIsLeftAreRefused) {
  EXPECT_EQ(WhyRefused(Head(1'000'000'000)), "the number of classes: 1000000000, more than 0");
  EXPECT_EQ(WhyRefused("\xff\xff\xff\xff\xff\xff\xff\xff\xff\xff\xff"), "a number has too many bytes");
  EXPECT_EQ(WhyRefused(Head(0) + "\xff\xff\xff\x7f"), "the number of qualifier declarations: 268435455, more than 0");
}

TEST(TReceivedNamespaceTest, AnotherVersionIsRefused) {
  TByteWriter writer;
  writer.Text(kNamespaceForm);
  writer.Number(kNamespaceVersion + 1);
  EXPECT_EQ(WhyRefused(writer.Bytes()), "it is not a namespace of version 1");
}

// A chain of classes without elements, each below the one before.
std::string ChainOfClasses(std::size_t length) {
  TByteWriter writer;
  writer.Number(0);  // qualifier declarations
  for (std::size_t number = 0; number < length; ++number) {
    writer.Text("X" + std::to_string(number));
    writer.Number(number);
    for (int nothing = 0; nothing < 6; ++nothing) writer.Byte(0);  // flags, qualifiers, properties, two of statics, methods
  }
  writer.Byte(0);       // the ending of the classes
  writer.Number(kEnd);  // of the instances
  writer.Byte(0);       // their ending
  return Head(length) + writer.Bytes();
}

TEST(TReceivedNamespaceTest, ClassesThatAreDerivedTooDeeplyAreRefused) {
  EXPECT_EQ(WhyRefused(ChainOfClasses(kMostClassDepth + 1)), "");
  EXPECT_EQ(WhyRefused(ChainOfClasses(kMostClassDepth + 2)), "the class X1001 is derived too deeply");
}

}  // namespace
}  // namespace NQRVZEP20
