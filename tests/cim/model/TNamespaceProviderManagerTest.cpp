// SPDX-License-Identifier: Apache-2.0
#include "TNamespaceProviderManager.h"

#include "TRootObject.h"
#include "tests/Support.h"

#include <boost/make_shared.hpp>

#include <type_traits>

namespace NQRVZEP20 {
namespace {

bool const gIsThereBeforeMain = TNamespaceProviderManager::fgInstance != nullptr;

class TNamedProvider : public INamespaceProvider {
public:
  explicit TNamedProvider(std::string name) : fName(std::move(name)) {}
  std::string const& GetName(TCIMContext const& context) const override {
    fContexts.push_back(context);
    return fName;
  }
  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const&) override { return nullptr; }

  mutable std::vector<TCIMContext> fContexts;

private:
  std::string fName;
};

boost::shared_ptr<TNamedProvider> ProviderNamed(std::string const& name) { return boost::make_shared<TNamedProvider>(name); }

// The process registry keeps its providers for ever, so most tests create a registry of their own.
class TNamespaceProviderManagerTest : public testing::Test {
protected:
  std::vector<boost::shared_ptr<INamespaceProvider>> Enumerate(std::size_t stopAfter = 1000) {
    std::vector<boost::shared_ptr<INamespaceProvider>> visited;
    fManager.EnumerateNamespaceProviders([&](boost::shared_ptr<INamespaceProvider> provider) {
      visited.push_back(provider);
      return visited.size() < stopAfter;
    });
    return visited;
  }

  TNamespaceProviderManager fManager;
};

TEST_F(TNamespaceProviderManagerTest, FindsAProviderByItsName) {
  auto const disks = ProviderNamed("Disks");
  auto const host = ProviderNamed("Host");
  fManager.RegisterNamespaceProvider(disks);
  fManager.RegisterNamespaceProvider(host);
  EXPECT_EQ(fManager.GetNamespaceProvider("Disks"), disks);
  EXPECT_EQ(fManager.GetNamespaceProvider("Host"), host);
}

TEST_F(TNamespaceProviderManagerTest, TheProcessRegistryIsCreatedWhenTheLibraryIsLoaded) {
  EXPECT_TRUE(gIsThereBeforeMain);
  EXPECT_EQ(TNamespaceProviderManager::GetInstance(), TNamespaceProviderManager::fgInstance);
}

TEST_F(TNamespaceProviderManagerTest, AProviderWhoseGetNameThrowsIsNotRegistered) {
  struct TNameless : TNamedProvider {
    TNameless() : TNamedProvider("") {}
    std::string const& GetName(TCIMContext const&) const override { throw TZEPException(kZEPStatusAccessDenied); }
  };
  EXPECT_STATUS(fManager.RegisterNamespaceProvider(boost::make_shared<TNameless>()), kZEPStatusAccessDenied);
  EXPECT_TRUE(Enumerate().empty());
}

TEST_F(TNamespaceProviderManagerTest, GetNameIsCalledOnceWithAnEmptyContext) {
  auto const host = ProviderNamed("Host");
  fManager.RegisterNamespaceProvider(host);
  fManager.GetNamespaceProvider("Host");
  Enumerate();
  ASSERT_EQ(host->fContexts.size(), 1u);
  EXPECT_TRUE(host->fContexts[0].empty());
}

TEST_F(TNamespaceProviderManagerTest, FirstProviderOfANameStaysAndNothingIsLogged) {
  auto const first = ProviderNamed("Host");
  auto const second = ProviderNamed("Host");
  TLogCapture log;
  fManager.RegisterNamespaceProvider(first);
  fManager.RegisterNamespaceProvider(second);
  EXPECT_EQ(fManager.GetNamespaceProvider("Host"), first);
  EXPECT_EQ(Enumerate().size(), 1u);
  EXPECT_EQ(second.use_count(), 1);
  EXPECT_EQ(log.Entries(), std::vector<std::string>());
}

TEST_F(TNamespaceProviderManagerTest, NamesThatDifferInCaseAreTwoProviders) {
  auto const upper = ProviderNamed("Host");
  auto const lower = ProviderNamed("host");
  fManager.RegisterNamespaceProvider(upper);
  fManager.RegisterNamespaceProvider(lower);
  EXPECT_EQ(fManager.GetNamespaceProvider("Host"), upper);
  EXPECT_EQ(fManager.GetNamespaceProvider("host"), lower);
}

TEST_F(TNamespaceProviderManagerTest, UnknownNameIsLoggedAsOneErrorAndThrowsNotFound) {
  fManager.RegisterNamespaceProvider(ProviderNamed("Host"));
  for (std::string const name : {"Disks", "host", "Host ", ""}) {
    SCOPED_TRACE(name);
    TLogCapture log;
    EXPECT_STATUS(fManager.GetNamespaceProvider(name), kZEPStatusNotFound);
    EXPECT_EQ(ReasonOf([&] { fManager.GetNamespaceProvider(name); }), "Failed to find nsp named " + name);
    EXPECT_EQ(log.Entries(), std::vector<std::string>(2, "[Error] Failed to find nsp named " + name));
  }
}

TEST_F(TNamespaceProviderManagerTest, EmptyProviderIsAFailedAssertionAndRegistersNothing) {
  TEnvironmentGuard const mode("ZEP_BOOST_ASSERT", nullptr);
  EXPECT_STATUS(fManager.RegisterNamespaceProvider(nullptr), kZEPStatusFail);
  EXPECT_TRUE(Enumerate().empty());
}

TEST_F(TNamespaceProviderManagerTest, EmptyProviderFailsTheCheckOfThePointer) {
  TEnvironmentGuard const mode("ZEP_BOOST_ASSERT", "throwboost");
  try {
    fManager.RegisterNamespaceProvider(nullptr);
    FAIL() << "nothing was thrown";
  } catch (std::exception const& failure) {
    EXPECT_NE(std::string(failure.what()).find(" [px != 0] func = "), std::string::npos) << failure.what();
  }
}

TEST_F(TNamespaceProviderManagerTest, EnumeratesInByteOrderOfTheNames) {
  auto const b = ProviderNamed("b");
  auto const upperB = ProviderNamed("B");
  auto const high = ProviderNamed("\xc3\xa4");
  auto const a = ProviderNamed("a");
  for (auto const& provider : {b, high, upperB, a}) fManager.RegisterNamespaceProvider(provider);
  EXPECT_EQ(Enumerate(), (std::vector<boost::shared_ptr<INamespaceProvider>>{upperB, a, b, high}));
}

TEST_F(TNamespaceProviderManagerTest, EnumerationStopsAtTheFirstFalse) {
  for (char const* name : {"a", "b", "c"}) fManager.RegisterNamespaceProvider(ProviderNamed(name));
  EXPECT_EQ(Enumerate(1).size(), 1u);
  EXPECT_EQ(Enumerate(2).size(), 2u);
  EXPECT_EQ(Enumerate().size(), 3u);
}

TEST_F(TNamespaceProviderManagerTest, AnEmptyRegistryCallsNothing) { EXPECT_TRUE(Enumerate().empty()); }

TEST_F(TNamespaceProviderManagerTest, KeepsItsProvidersAlive) {
  boost::weak_ptr<TNamedProvider> watched;
  {
    TNamespaceProviderManager manager;
    auto const host = ProviderNamed("Host");
    watched = host;
    manager.RegisterNamespaceProvider(host);
    EXPECT_EQ(host.use_count(), 2);
  }
  EXPECT_TRUE(watched.expired());
}

TEST(TRootObjectTest, ReturnsTheProcessRegistry) {
  boost::shared_ptr<INamespaceProviderManager> const manager = TRootObject::GetNamespaceProviderManager();
  ASSERT_TRUE(manager);
  EXPECT_EQ(manager, TRootObject::GetNamespaceProviderManager());
  EXPECT_EQ(manager, TNamespaceProviderManager::GetInstance());
  OnNewThread([&] { EXPECT_EQ(manager, TNamespaceProviderManager::GetInstance()); });
}

// Of the two owners, one is this test's temporary pointer and the other is the library.
TEST(TRootObjectTest, TheLibraryKeepsTheRegistryAlive) { EXPECT_EQ(TNamespaceProviderManager::GetInstance().use_count(), 2); }

TEST(TRootObjectTest, ARegisteredProviderIsFoundThroughTheInterface) {
  auto const provider = ProviderNamed("TRootObjectTest");
  TRootObject::GetNamespaceProviderManager()->RegisterNamespaceProvider(provider);
  EXPECT_EQ(TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("TRootObjectTest"), provider);
}

TEST(TRootObjectTest, CoreLoggerIsTheLoggerOfTheThread) {
  EXPECT_EQ(TRootObject::GetCoreLogger(), TLogger::GetInstance());
  OnNewThread([mine = TRootObject::GetCoreLogger()] {
    EXPECT_EQ(TRootObject::GetCoreLogger(), TLogger::GetInstance());
    EXPECT_NE(TRootObject::GetCoreLogger(), mine);
  });
}

}  // namespace
}  // namespace NQRVZEP20
