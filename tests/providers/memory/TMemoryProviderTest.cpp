// SPDX-License-Identifier: Apache-2.0
#include "TMemoryProvider.h"

#include "Collect.h"

namespace NQRVZEP20 {
namespace {

TEST(TMemoryProviderTest, NamespaceIsFilledOnceAtTheFirstCall) {
  int fills = 0;
  TMemoryProvider provider("Disks", "root/disks", [&](TMemoryNamespace& ns) {
    ++fills;
    ns.DefineClass("X_Disk");
  });
  EXPECT_EQ(provider.GetName(kNone), "Disks");
  EXPECT_EQ(fills, 0);

  auto const ns = provider.GetNamespace(kNone);
  EXPECT_EQ(fills, 1);
  EXPECT_EQ(ns->GetName(kNone), "root/disks");
  EXPECT_THAT(ClassNames(*ns), ElementsAre("X_Disk"));
  EXPECT_EQ(provider.GetNamespace(kNone), ns);
  EXPECT_EQ(fills, 1);
}

TEST(TMemoryProviderTest, FailureOfTheFillFunctionPassesOnAndTheNextCallFillsANewNamespace) {
  int fills = 0;
  TMemoryProvider provider("Disks", "root/disks", [&](TMemoryNamespace& ns) {
    ns.DefineClass("X_Disk");
    if (++fills == 1) throw TZEPException(kZEPStatusFileSystemError);
  });
  EXPECT_STATUS(provider.GetNamespace(kNone), kZEPStatusFileSystemError);
  EXPECT_THAT(ClassNames(*provider.GetNamespace(kNone)), ElementsAre("X_Disk"));
}

TEST(TMemoryProviderTest, IsFoundInTheRegistry) {
  auto const provider = boost::make_shared<TMemoryProvider>("TMemoryProviderTest", "root/disks",
                                                            [](TMemoryNamespace& ns) { ns.DefineClass("X_Disk"); });
  auto const registry = TRootObject::GetNamespaceProviderManager();
  registry->RegisterNamespaceProvider(provider);
  EXPECT_EQ(registry->GetNamespaceProvider("TMemoryProviderTest"), provider);
}

TEST(TMemoryProviderTest, FreesItsNamespace) {
  auto provider = boost::make_shared<TMemoryProvider>("Disks", "root/disks", [](TMemoryNamespace&) {});
  boost::weak_ptr<ICIMNamespace> const ns = provider->GetNamespace(kNone);
  EXPECT_FALSE(ns.expired());
  provider.reset();
  EXPECT_TRUE(ns.expired());
}

}  // namespace
}  // namespace NQRVZEP20
