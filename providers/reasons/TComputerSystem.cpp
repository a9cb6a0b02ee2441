// SPDX-License-Identifier: Apache-2.0
#include "TComputerSystem.h"

#include <cstdlib>

namespace NQRVZEP20 {

namespace {

constexpr char const* kClassName = "CIM_ComputerSystem";
constexpr char const* kNameFile = "/proc/sys/kernel/hostname";

bool IsNamed() {
  char const* const name = std::getenv("ZEP_HOST_NAME");
  return name != nullptr && *name != '\0';
}

TFinding<std::string> NameFrom(TMachineFiles const& files) {
  if (IsNamed()) return std::string(std::getenv("ZEP_HOST_NAME"));
  return files.Line(kNameFile).Then([](std::string const& name) -> TFinding<std::string> {
    if (name == "(none)") return TMissing{kMissingPlaceholder, "no host name is set: the kernel reports \"(none)\""};
    return name;
  });
}

}  // namespace

TComputerSystem::TComputerSystem(TMachineFiles const& files)
    : fSource(IsNamed() ? "ZEP_HOST_NAME" : kNameFile), fName(NameFrom(files)) {}

TRecord TComputerSystem::Record() const {
  TRecord record(kClassName, fSource);
  record.AddKey("CreationClassName", kClassName);
  record.AddKey("Name", fName);
  return record;
}

void TComputerSystem::AddSystemKeys(TRecord& record) const {
  record.AddKey("SystemCreationClassName", kClassName);
  record.AddPropagatedKey("SystemName", fName);
  record.AddKey("CreationClassName", record.GetClassName());
}

void TComputerSystem::AddDeviceKeys(TRecord& record, std::string const& id) const {
  AddSystemKeys(record);
  record.AddKey("DeviceID", id);
}

void TComputerSystem::AddHostedKeys(TRecord& record, std::string const& name) const {
  AddSystemKeys(record);
  record.AddKey("Name", name);
}

}  // namespace NQRVZEP20
