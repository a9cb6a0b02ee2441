// SPDX-License-Identifier: Apache-2.0

// From a file system to the slot of its disk, by the associations of the loaded plug-in and the interfaces of the library alone.

#include "tests/Machines.h"
#include "tests/providers/memory/Collect.h"
#include "zepcore.h"

namespace NQRVZEP20 {
namespace {

constexpr char const *kAntecedent = "Antecedent", *kDependent = "Dependent";

class ChainTest : public testing::Test {
protected:
  using TInstance = boost::shared_ptr<ICIMInstance>;

  ChainTest() {
    TOSSpecific::LoadPluginLibrary(TEST_STORAGE_PLUGIN);
    TRootObject::GetNamespaceProviderManager()->EnumerateNamespaceProviders(
        [this](boost::shared_ptr<INamespaceProvider> const& provider) {
          if (provider->GetName(kNone) == "Storage") fNamespace = provider->GetNamespace(kNone);
          return true;
        });
  }

  static TCIMValue ValueOf(TInstance const& instance, char const* property) {
    return instance->GetProperty(property, kNone)->GetValue(kNone);
  }

  std::vector<TInstance> InstancesOf(char const* className) const {
    return All(*fNamespace->GetClass(className, kNone), &ICIMClass::EnumerateInstances);
  }

  TInstance With(char const* className, char const* property, std::string const& value) const {
    for (TInstance const& instance : InstancesOf(className))
      if (auto const found = ValueOf(instance, property); !found.IsNull() && found.ToString() == value) return instance;
    ADD_FAILURE() << className << " has no instance whose " << property << " is " << value;
    return nullptr;
  }

  // The instances at the other ends of the associations whose end `from` is this instance.
  std::vector<TInstance> Associated(TInstance const& instance, char const* association, char const* from, char const* to) const {
    std::vector<TInstance> others;
    std::string const path = instance->GetPath(kNone).GetPath();
    for (TInstance const& link : InstancesOf(association))
      if (static_cast<TCIMReference>(ValueOf(link, from)).GetPath() == path)
        others.push_back(fNamespace->GetInstance(static_cast<TCIMReference>(ValueOf(link, to)), kNone));
    return others;
  }

  // The only one of them.
  TInstance Next(TInstance const& instance, char const* association, char const* from = kDependent,
                 char const* to = kAntecedent) const {
    auto const others = Associated(instance, association, from, to);
    EXPECT_EQ(others.size(), 1u) << association << " of " << instance->GetPath(kNone).GetPath();
    return others.empty() ? nullptr : others.front();
  }

  static std::string Id(TInstance const& instance) { return instance ? ValueOf(instance, "DeviceID").ToString() : "none"; }

  TRecordedMachine const fMachine{"server"};
  TEnvironmentGuard fRoot{"ZEP_ROOT", fMachine.Root().c_str()};
  boost::shared_ptr<ICIMNamespace> fNamespace;
};

TEST_F(ChainTest, FromAFileSystemOneComesToItsSlot) {
  auto const partition = Next(With("CIM_UnixLocalFileSystem", "Root", "/boot/efi"), "CIM_ResidesOnExtent");
  EXPECT_EQ(Id(partition), "nvme0n1p2");
  auto const medium = Next(partition, "CIM_BasedOn");
  EXPECT_EQ(Id(medium), "nvme0n1");
  auto const disk = Next(medium, "CIM_MediaPresent");
  EXPECT_EQ(ValueOf(disk, "ElementName").ToString(), "QEMU NVMe Ctrl");
  auto const controller = Next(disk, "CIM_ControlledBy");
  EXPECT_EQ(Id(controller), "0000:03:00.0");
  auto const package = Next(disk, "CIM_Realizes");
  EXPECT_EQ(ValueOf(package, "SerialNumber").ToString(), "NVME0001");
  auto const slot = Next(package, "CIM_PackageInSlot");
  ASSERT_TRUE(slot);
  EXPECT_EQ(ValueOf(slot, "Tag").ToString(), "PCI slot 0");
}

// A mirror and a volume group each have two partitions below, on disks with controllers of their own.
TEST_F(ChainTest, FromAMirrorOneComesToBothControllers) {
  auto const mirror = Next(With("CIM_UnixLocalFileSystem", "Root", "/data"), "CIM_ResidesOnExtent");
  EXPECT_EQ(Id(mirror), "md0");
  std::vector<std::string> controllers;
  for (auto const& partition : Associated(mirror, "CIM_BasedOn", kDependent, kAntecedent))
    controllers.push_back(Id(Next(Next(Next(partition, "CIM_BasedOn"), "CIM_MediaPresent"), "CIM_ControlledBy")));
  EXPECT_THAT(controllers, testing::UnorderedElementsAre("0000:03:00.0", "0000:00:04.0"));
}

}  // namespace
}  // namespace NQRVZEP20
