// SPDX-License-Identifier: Apache-2.0

// Large MOF texts: time and memory are proportional to the text, however deep the inheritance is.

#include "Mof.h"
#include "tests/providers/memory/Collect.h"

#include <malloc.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <ctime>

namespace NQRVZEP20 {
namespace {

constexpr char kQualifiers[] =
    "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);\n"
    "Qualifier Association : boolean = false, Scope(association);\n"
    "Qualifier Description : string = null, Scope(any), Flavor(Translatable);\n";

std::string Name(int number) { return "X_C" + std::to_string(number); }

// A chain of classes of that depth, each with a property; optionally associations, and an instance of the last class.
std::string Chain(int depth, bool isAssociation, bool hasInstance) {
  std::string text = kQualifiers;
  for (int at = 0; at < depth; ++at) {
    std::string const number = std::to_string(at);
    if (at == 0 && isAssociation) text += "[Association]\n";
    text += "class " + Name(at) + (at == 0 ? "" : " : " + Name(at - 1)) + " {\n";
    text += at == 0 ? "  [Key] uint32 Id;\n};\n" : "  [Description(\"" + number + "\")] uint32 P" + number + ";\n};\n";
  }
  if (hasInstance) text += "instance of " + Name(depth - 1) + " { Id = 7; P1 = 8; };\n";
  return text;
}

TEST(DeepInheritanceTest, AClassWithAHundredThousandSuperclassesInheritsFromAll) {
  constexpr int kDepth = 100000;
  auto const ns = NewNamespace();
  ReadMofText(Chain(kDepth, true, true), "deep.mof", ns);
  auto const last = ns->GetClass(Name(kDepth - 1), kNone);
  EXPECT_TRUE(last->GetClassFlag(kNone));
  EXPECT_EQ(SubClassNames(*ns->GetClass(Name(0), kNone)).size(), kDepth - 1u);
  auto const instances = All(*last, &ICIMClass::EnumerateInstances);
  ASSERT_EQ(instances.size(), 1u);
  EXPECT_EQ(instances[0]->GetPath(kNone).GetPath(), Name(kDepth - 1) + ".Id=\"7\"");
  EXPECT_EQ(instances[0]->GetProperty("P1", kNone)->GetValue(kNone).ToString(), "8");
  EXPECT_EQ(All(*instances[0], &ICIMInstance::EnumerateProperties).size(), std::size_t(kDepth));
  EXPECT_TRUE(last->GetPropertyDecl("Id", kNone)->IsKey(kNone));
}

// The processor time of the fastest of three runs.
template <class TAction>
double SecondsOf(TAction const& action) {
  double best = 1e9;
  for (int run = 0; run < 3; ++run) {
    std::clock_t const start = std::clock();
    action();
    best = std::min(best, static_cast<double>(std::clock() - start) / CLOCKS_PER_SEC);
  }
  return best;
}

TEST(DeepInheritanceTest, TenTimesTheDepthTakesLessThanThirtyTimesAsLong) {
  for (bool const hasInstance : {false, true}) {
    SCOPED_TRACE(hasInstance);
    std::string const small = Chain(1000, false, hasInstance), large = Chain(10000, false, hasInstance);
    auto const read = [](std::string const& text) {
      auto const ns = NewNamespace();
      ReadMofText(text, "deep.mof", ns);
      for (auto const& root : All(*ns, &ICIMNamespace::EnumerateClasses))
        root->EnumerateSubClasses([](boost::shared_ptr<ICIMClass> cls) { return !cls->GetClassFlag(kNone); }, kNone);
    };
    double const ofSmall = SecondsOf([&] { read(small); });
    EXPECT_LT(SecondsOf([&] { read(large); }), 30 * ofSmall);
  }
}

TEST(DeepInheritanceTest, InstancesCreatedFromTheLowestClassUpwardsHaveTheKeysOfTheHighest) {
  auto const ns = NewNamespace();
  ReadMofText(Chain(50, false, false), "deep.mof", ns);
  for (int at = 49; at >= 0; --at) {
    auto const cls = ns->GetClass(Name(at), kNone);
    auto const instance = cls->CreateInstance(kNone);
    instance->GetProperty("Id", kNone)->SetValue(TCIMValue(static_cast<unsigned int>(at)), kNone);
    cls->CommitInstance(instance, kNone);
    EXPECT_EQ(instance->GetPath(kNone).GetPath(), Name(at) + ".Id=\"" + std::to_string(at) + "\"");
    EXPECT_EQ(All(*instance, &ICIMInstance::EnumerateProperties).size(), at + 1u);
    EXPECT_STATUS(cls->AddPropertyDecl("More", TCIMValue(1u), kNone), kZEPStatusInvalidOpSequence);
  }
}

TEST(DeepInheritanceTest, AClassBecomesAnAssociationWithItsSuperclass) {
  auto const ns = NewNamespace();
  ReadMofText(Chain(20, false, false), "deep.mof", ns);
  auto const mark = [&](int at, bool value) {
    ns->GetClass(Name(at), kNone)->AddQualifier(ns->GetQualifierDecl("Association", kNone), TCIMValue(value), 0, kNone);
  };
  auto const isAssociation = [&](int at) { return ns->GetClass(Name(at), kNone)->GetClassFlag(kNone); };
  mark(5, false);
  EXPECT_FALSE(isAssociation(19));
  mark(10, true);
  EXPECT_FALSE(isAssociation(9));
  EXPECT_TRUE(isAssociation(10));
  mark(2, true);
  EXPECT_FALSE(isAssociation(1));
  for (int const at : {2, 5, 9, 19}) EXPECT_TRUE(isAssociation(at)) << at;
  EXPECT_TRUE(ns->CreateClass(ns->GetClass(Name(19), kNone), "X_New", kNone)->GetClassFlag(kNone));
}

// The peak memory of a process that reads the file, in bytes.
double PeakOfReading(std::string const& path) {
  ::malloc_trim(0);  // the process would use free memory of earlier tests first
  pid_t const child = ::fork();
  if (child == 0) {
    ReadMofFile(path, NewNamespace());
    ::_exit(0);
  }
  int status = 0;
  rusage usage = {};
  EXPECT_EQ(::wait4(child, &status, 0, &usage), child);
  EXPECT_EQ(status, 0);
  return usage.ru_maxrss * 1024.0;
}

// The peak memory that reading the text takes, as a multiple of the size of the text.
double MemoryPerByteOf(std::string const& text) {
  TTempDir const dir;
  WriteFile(dir.Path("empty.mof"), "");
  WriteFile(dir.Path("text.mof"), text);
  double const taken = PeakOfReading(dir.Path("text.mof")) - PeakOfReading(dir.Path("empty.mof"));
  EXPECT_GT(taken, 0.5 * static_cast<double>(text.size()));  // the measurement worked
  return taken / static_cast<double>(text.size());
}

TEST(DeepInheritanceTest, ASchemaTakesAtMostSevenAndAHalfTimesItsSizeInMemory) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer uses additional memory";
  std::string text = kQualifiers;
  for (int at = 0; at < 5000; ++at) {
    std::string const number = std::to_string(at);
    text += "[Description(\"Class number " + number + " of the generated schema, which describes a part of a machine.\")]\n" +
            "class " + Name(at) + (at == 0 ? "" : " : " + Name((at - 1) / 3)) + " {\n";
    for (int p = 0; p < 8; ++p)
      text += "  [Description(\"Property " + std::to_string(p) + " of class " + number +
              ", which describes a detail of the part.\")]\n  string P" + number + "_" + std::to_string(p) + ";\n";
    text += "  [Description(\"Starts the part, after a delay in seconds.\")]\n  uint32 Start(uint32 Delay, string Name);\n};\n";
  }
  EXPECT_LT(MemoryPerByteOf(text), 7.5);
}

TEST(DeepInheritanceTest, EmptyClassesTakeAtMostTwentyFourTimesTheirTextInMemory) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer uses additional memory";
  std::string text;
  for (int at = 0; at < 40000; ++at) text += "class " + Name(at) + " {\n};\n";
  EXPECT_LT(MemoryPerByteOf(text), 24);
}

TEST(DeepInheritanceTest, InstancesTakeAtMostTenTimesTheirTextInMemory) {
  if (kIsSanitized) GTEST_SKIP() << "a sanitizer uses additional memory";
  std::string text = std::string(kQualifiers) + "class X_Disk { [Key] uint32 Id; string Name; uint64 Size; };\n";
  for (int at = 0; at < 40000; ++at) {
    std::string const number = std::to_string(at);
    text += "instance of X_Disk {\n  Id = " + number + ";\n  Name = \"disk " + number + "\";\n  Size = " + number + "000;\n};\n";
  }
  EXPECT_LT(MemoryPerByteOf(text), 10);
}

}  // namespace
}  // namespace NQRVZEP20
