// SPDX-License-Identifier: Apache-2.0

// Large namespaces: 1,600 classes on nine levels, 10,000 instances, and lookups whose time does not depend on the size.

#include "Collect.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <thread>

namespace NQRVZEP20 {
namespace {

std::string NumberedName(char const* prefix, int number) { return prefix + std::to_string(number); }

// Class 0 is the root and class i is a subclass of class (i - 1) / 3 up to depth 9, with 10 properties each.
void DefineClasses(TMemoryNamespace& ns, int count) {
  for (int i = 0; i < count; ++i) {
    auto builder = ns.DefineClass(NumberedName("X_Class", i), i == 0 ? "" : NumberedName("X_Class", (i - 1) / 3));
    if (i == 0) builder.Key("Id", "uint32");
    for (int p = 0; p < 10; ++p)
      builder.Property("P" + std::to_string(i) + "_" + std::to_string(p), "string").Description("text");
  }
}

TEST(ManyElementsTest, SchemaOf1600ClassesIsFoundAndEnumerated) {
  auto const ns = NewNamespace();
  DefineClasses(*ns, 1600);
  for (int i = 0; i < 1600; ++i)
    ASSERT_EQ(ns->GetClass(NumberedName("x_class", i), kNone)->GetName(kNone), NumberedName("X_Class", i));
  EXPECT_EQ(SubClassNames(*ns->GetClass("X_Class0", kNone)).size(), 1599u);
  EXPECT_EQ(ns->GetClass("X_Class1599", kNone)->GetPropertyDecl("p0_9", kNone)->GetName(kNone), "P0_9");
}

TEST(ManyElementsTest, TenThousandInstancesAreEachFoundByTheirPath) {
  auto const ns = NewNamespace();
  DefineClasses(*ns, 40);
  for (int i = 0; i < 10000; ++i) ns->AddInstance(NumberedName("X_Class", i % 40), {{"Id", i}, {"P0_3", "text"}});
  auto const instances = All(*ns->GetClass("X_Class0", kNone), &ICIMClass::EnumerateInstances);
  ASSERT_EQ(instances.size(), 10000u);
  for (auto const& instance : instances) ASSERT_EQ(ns->GetInstance(instance->GetPath(kNone), kNone), instance);
}

// The time of the fastest of three runs, in seconds.
template <class TAction>
double SecondsOf(TAction const& action) {
  double best = 1e9;
  for (int run = 0; run < 3; ++run) {
    auto const start = std::chrono::steady_clock::now();
    action();
    best = std::min(best, std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count());
  }
  return best;
}

// A namespace of `count` classes and as many instances of one of them.
class TLargeNamespace {
public:
  explicit TLargeNamespace(int count) {
    for (int i = 0; i < count; ++i) fNs->CreateClass(nullptr, NumberedName("X_Class", i), kNone);
    fNs->DefineClass("X_Item").Key("Id", "uint32");
    for (int i = 0; i < count; ++i) fPaths.push_back(fNs->AddInstance("X_Item", {{"Id", i}})->GetPath(kNone));
  }

  // A thousand lookups of twenty classes and instances from all parts of the namespace.
  void LookUp() const {
    for (std::size_t i = 0; i < 1000; ++i) {
      std::size_t const position = i % 20 * fPaths.size() / 20;
      ASSERT_TRUE(fNs->GetClass(NumberedName("X_Class", static_cast<int>(position)), kNone));
      ASSERT_TRUE(fNs->GetInstance(fPaths[position], kNone));
    }
  }

private:
  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
  std::vector<TCIMReference> fPaths;
};

TEST(ManyElementsTest, LookupInAHundredTimesLargerNamespaceTakesLessThanTenTimesAsLong) {
  TLargeNamespace const small(300), large(30000);
  double const inSmall = SecondsOf([&] { small.LookUp(); });
  double const inLarge = SecondsOf([&] { large.LookUp(); });
  EXPECT_LT(inLarge, 10 * inSmall);
}

TEST(ManyElementsTest, SeveralThreadsReadAtOnce) {
  auto const ns = NewNamespace();
  DefineClasses(*ns, 40);
  for (int i = 0; i < 200; ++i) ns->AddInstance(NumberedName("X_Class", i % 40), {{"Id", i}});
  std::atomic<int> found{0};
  std::vector<std::thread> readers;
  for (int reader = 0; reader < 4; ++reader)
    readers.emplace_back([&] {
      for (auto const& instance : All(*ns->GetClass("X_Class0", kNone), &ICIMClass::EnumerateInstances))
        if (ns->GetInstance(instance->GetPath(kNone), kNone) == instance) ++found;
    });
  for (std::thread& reader : readers) reader.join();
  EXPECT_EQ(found, 800);
}

}  // namespace
}  // namespace NQRVZEP20
