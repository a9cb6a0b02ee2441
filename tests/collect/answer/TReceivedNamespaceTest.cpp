// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedNamespace.h"

#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "collect/ClassTree.h"
#include "collect/TNamespaceView.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TBadAnswer.h"
#include "tests/Support.h"
#include "tests/collect/SamplePlugIns.h"
#include "tests/collect/answer/Bytes.h"
#include "tests/collect/answer/DumpOf.h"
#include "tests/collect/answer/RandomNamespace.h"

#include <boost/make_shared.hpp>

#include <ctime>
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

// A class without elements. `super` is the number of its superclass plus 1, or 0.
void WriteClass(TByteWriter& writer, std::string const& name, std::size_t super) {
  writer.Text(name);
  writer.Number(super);
  for (int nothing = 0; nothing < 6; ++nothing) writer.Byte(0);  // flags, qualifiers, properties, two of statics, methods
}

void WriteEndOfTree(TByteWriter& writer) {
  writer.Number(kEnd);
  writer.Byte(0);
}

// A chain of classes, each below the one before.
std::string ChainOfClasses(std::size_t length) {
  TByteWriter writer;
  writer.Number(0);  // qualifier declarations
  for (std::size_t number = 0; number < length; ++number) WriteClass(writer, "X" + std::to_string(number), number);
  writer.Byte(0);  // the ending of the classes
  WriteEndOfTree(writer);
  return Head(length) + writer.Bytes();
}

// A class X_Item with one instance of these properties, and the path that follows.
std::string OneInstance(std::vector<std::pair<std::string, TCIMValue>> const& properties, std::string const& path) {
  TByteWriter writer;
  writer.Number(0);
  WriteClass(writer, "X_Item", 0);
  writer.Byte(0);
  writer.Number(kLayout);
  writer.Number(0);  // the class
  writer.Byte(0);    // it did not fail
  writer.Number(properties.size());
  for (auto const& [name, value] : properties) {
    writer.Text(name);
    writer.Number(0);  // without a declaration
  }
  writer.Number(kInstance);
  writer.Number(0);  // the layout
  for (auto const& [name, value] : properties) WriteValue(writer, value, {});
  writer.Raw(path);
  WriteEndOfTree(writer);
  return Head(1) + writer.Bytes();
}

std::string PathOfKeys(std::vector<std::uint64_t> const& positions) {
  TByteWriter writer;
  writer.Number(kPathOfKeys);
  writer.Number(positions.size());
  for (std::uint64_t const position : positions) writer.Number(position);
  return writer.Bytes();
}

TEST(TReceivedNamespaceTest, ClassesThatAreDerivedTooDeeplyAreRefused) {
  EXPECT_EQ(WhyRefused(ChainOfClasses(kMostClassDepth + 1)), "");
  EXPECT_EQ(WhyRefused(ChainOfClasses(kMostClassDepth + 2)), "the class X101 is derived too deeply");
}

TEST(TReceivedNamespaceTest, APathThatHasAKeyTwiceIsRefused) {
  EXPECT_EQ(WhyRefused(OneInstance({{"Id", 1}, {"Text", "x"}}, PathOfKeys({0, 1}))), "");
  EXPECT_EQ(WhyRefused(OneInstance({{"Id", 1}, {"Text", "x"}}, PathOfKeys({1, 1}))), "a path has a key twice");
  EXPECT_EQ(WhyRefused(OneInstance({{"Id", 1}}, PathOfKeys({1}))), "a key is not a property");
}

TEST(TReceivedNamespaceTest, APathWithTooManyKeysIsRefused) {
  std::vector<std::pair<std::string, TCIMValue>> properties;
  std::vector<std::uint64_t> positions;
  for (std::size_t n = 0; n < kMostKeys; ++n) {
    properties.emplace_back("P" + std::to_string(n), 1);
    positions.push_back(n);
  }
  EXPECT_EQ(WhyRefused(OneInstance(properties, PathOfKeys(positions))), "");
  properties.emplace_back("More", 1);
  positions.push_back(kMostKeys);
  EXPECT_EQ(WhyRefused(OneInstance(properties, PathOfKeys(positions))), "the number of keys: 257, more than 256");
}

TEST(TReceivedNamespaceTest, ALongNameIsRefused) {
  EXPECT_EQ(WhyRefused(OneInstance({{std::string(kLongestName, 'P'), 1}}, PathOfKeys({0}))), "");
  EXPECT_EQ(WhyRefused(OneInstance({{std::string(kLongestName + 1, 'P'), 1}}, PathOfKeys({0}))),
            "a name has more than 1024 bytes");
}

TEST(TReceivedNamespaceTest, AnInstanceWithTooManyPropertiesIsRefused) {
  std::vector<std::pair<std::string, TCIMValue>> properties;
  while (properties.size() <= kMostElements) properties.emplace_back("P" + std::to_string(properties.size()), 1);
  EXPECT_EQ(WhyRefused(OneInstance(properties, PathOfKeys({0}))), "the number of properties: 10001, more than 10000");
}

TEST(TReceivedNamespaceTest, TheNamespacesOfAPlugInAreCountedTogether) {
  std::string const bytes = OneInstance({{"Id", 1}}, PathOfKeys({0}));
  TAnswerCounts one;
  TReceivedNamespace::From(bytes, one);
  EXPECT_EQ(one.fClasses, 1u);
  EXPECT_EQ(one.fInstances, 1u);
  EXPECT_EQ(one.fValues, 1u);
  EXPECT_GT(one.fElements, 0u);

  struct TRow {
    std::uint64_t TAnswerCounts::*fCount;
    std::uint64_t fMost;
    char const* fWhy;
  } const rows[] = {
      {&TAnswerCounts::fClasses, kMostClasses, "the number of classes: 1, more than 0"},
      {&TAnswerCounts::fElements, kMostElementsInAll, "there are more than 2000000 elements"},
      {&TAnswerCounts::fInstances, kMostInstances, "there are more than 2000000 instances"},
      {&TAnswerCounts::fValues, kMostValues, "there are more than 50000000 values"},
  };
  for (TRow const& row : rows) {
    TAnswerCounts counts;
    counts.*row.fCount = row.fMost;
    try {
      TReceivedNamespace::From(bytes, counts);
      ADD_FAILURE() << row.fWhy;
    } catch (TBadAnswer const& refusal) {
      EXPECT_STREQ(refusal.what(), row.fWhy);
    }
  }
}

// ---- Work in proportion to the bytes: each of these takes minutes when it is quadratic ----

template <class TWork>
void ExpectSoon(TWork work) {
  std::clock_t const begin = std::clock();
  work();
  EXPECT_LT((std::clock() - begin) / CLOCKS_PER_SEC, kIsSanitized ? 60 : 8);
}

TEST(TReceivedNamespaceTest, ManyRootClassesAreReadSoon) {
  TByteWriter writer;
  writer.Number(0);
  for (std::size_t n = 0; n < kMostClasses; ++n) WriteClass(writer, "X" + std::to_string(n), 0);
  writer.Byte(0);
  for (std::size_t n = 0; n < kMostClasses; ++n) WriteEndOfTree(writer);
  ExpectSoon([&] { EXPECT_EQ(ClassesOf(*TReceivedNamespace::From(Head(kMostClasses) + writer.Bytes())).size(), kMostClasses); });
}

TEST(TReceivedNamespaceTest, TheInstancesOfManySubclassesAreReadSoon) {
  TByteWriter writer;
  writer.Number(0);
  for (std::size_t n = 0; n < kMostClasses; ++n) WriteClass(writer, "X" + std::to_string(n), n == 0 ? 0 : 1);
  writer.Byte(0);
  for (std::size_t n = 0; n < kMostClasses; ++n) {
    writer.Number(kLayout);
    writer.Number(n);
    writer.Byte(0);
    writer.Number(0);  // properties
    writer.Number(kInstance);
    writer.Number(n);
    writer.Raw(PathOfKeys({}));
  }
  WriteEndOfTree(writer);
  ExpectSoon([&] {
    auto const ns = TReceivedNamespace::From(Head(kMostClasses) + writer.Bytes());
    TNamespaceView const view("X", ns);
    for (std::size_t n = 1; n < kMostClasses; ++n) ASSERT_EQ(view.InstancesOf("X" + std::to_string(n)).size(), 1u);
    EXPECT_EQ(view.InstancesOf("X0").size(), kMostClasses);
    EXPECT_EQ(view.PathOf(*view.InstancesOf("X7").front()), "root/x:X7#1");
  });
}

TEST(TReceivedNamespaceTest, ThePropertiesOfAWideInstanceAreReadSoon) {
  std::vector<std::pair<std::string, TCIMValue>> properties;
  TCIMValue const list(TCIMValue::TCIMType::kCIMTypeUint8, 0, std::vector<TCIMValue>(200, static_cast<unsigned char>(1)));
  while (properties.size() < kMostElements) properties.emplace_back("P" + std::to_string(properties.size()), list);
  ExpectSoon([&] {
    auto const ns = TReceivedNamespace::From(OneInstance(properties, PathOfKeys({})));
    auto const instance = TNamespaceView("X", ns).AllInstances().front();
    for (auto const& [name, value] : properties) ASSERT_TRUE(instance->GetProperty(name, kNone));
    EXPECT_FALSE(instance->GetProperty("P", kNone));
    EXPECT_EQ(instance->GetProperty("p9999", kNone)->GetValue(kNone), list);
  });
}

TEST(TReceivedNamespaceTest, ReferencesToAClassOutsideWithManyKeysAreReadSoon) {
  int const number = kIsSanitized ? 500 : 2000;
  TByteWriter writer;
  writer.Number(0);
  WriteClass(writer, "X_Item", 0);
  writer.Byte(0);
  writer.Number(kLayout);
  writer.Number(0);
  writer.Byte(0);
  writer.Number(static_cast<std::uint64_t>(number));
  for (int n = 0; n < number; ++n) writer.Text("P" + std::to_string(n)), writer.Number(0);
  writer.Number(kInstance);
  writer.Number(0);
  for (int n = 0; n < number; ++n) {
    writer.Byte(TCIMValue::TCIMType::kCIMTypeReference);
    writer.Byte(0);    // it has no namespace
    writer.Number(1);  // its class is outside
    writer.Text("Y_Item");
    writer.Text("");
    writer.Number(kMostKeys);
    for (std::size_t key = 0; key < kMostKeys; ++key) {
      writer.Text("K" + std::to_string(n) + "_" + std::to_string(key));
      WriteValue(writer, true, {});
    }
  }
  writer.Raw(PathOfKeys({}));
  WriteEndOfTree(writer);
  ExpectSoon([&] {
    auto const ns = TReceivedNamespace::From(Head(1) + writer.Bytes());
    int references = 0;
    TNamespaceView("X", ns).AllInstances().front()->EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> property) {
          references += property->GetValue(kNone).IsReference() ? 1 : 0;
          return true;
        },
        kNone);
    EXPECT_EQ(references, number);
  });
}

}  // namespace
}  // namespace NQRVZEP20
