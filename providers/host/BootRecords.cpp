// SPDX-License-Identifier: Apache-2.0
#include "BootRecords.h"

#include "SmbiosFields.h"
#include "TCIMSchemaHelper.h"

namespace NQRVZEP20 {

namespace {

constexpr char const* kSysfs = "/sys/firmware";
constexpr char const* kEfi = "/sys/firmware/efi";
std::string const kVariables = "/sys/firmware/efi/efivars/";
std::string const kGlobal = "-8be4df61-93ca-11d2-aa0d-00e098032b8c";  // the vendor GUID of the UEFI standard's own variables

TFinding<bool> IsUefi(TMachineFiles const& files) {
  if (!files.Exists(kSysfs)) return TMissing{kMissingNotGiven, std::string(kSysfs) + " does not exist"};
  return files.Exists(kEfi);
}

// A variable of one byte. The file has four bytes of attributes before it.
TFinding<bool> VariableOf(TMachineFiles const& files, char const* name) {
  auto const isUefi = IsUefi(files);
  if (!isUefi) return isUefi.Why();
  if (!*isUefi) return TMissing{kMissingNotApplicable, "the machine was not started by UEFI firmware"};
  std::string const path = kVariables + name + kGlobal;
  return files.Content(path).Then([&](std::string const& bytes) -> TFinding<bool> {
    if (bytes.size() != 5) return TMissing{kMissingUnexpected, path + " does not contain one byte"};
    return bytes[4] != 0;
  });
}

TFinding<std::string> BootStatusFrom(std::uint8_t status) {
  constexpr char const* words[] = {"No errors detected",
                                   "No bootable media",
                                   "Operating system failed to load",
                                   "Firmware-detected hardware failure",
                                   "Operating system-detected hardware failure",
                                   "User-requested boot",
                                   "System security violation",
                                   "Previously-requested image",
                                   "System watchdog timer expired"};
  if (status >= 192) return std::string("Product-specific status ") + std::to_string(status);
  if (status >= 128) return std::string("Status of the manufacturer ") + std::to_string(status);
  return WordFor(status, words, 0, "boot status");
}

TFinding<std::string> WakeUpTypeFrom(std::uint8_t type) {
  constexpr char const* words[] = {"APM Timer",    "Modem Ring", "LAN Remote",
                                   "Power Switch", "PCI PME#",   "AC Power Restored"};  // from 3
  if (type == 1) return std::string("Other");
  if (type == 2) return Unknown();
  return WordFor(type, words, 3, "wake-up type");
}

}  // namespace

TRecord BootRecord(TMachineFiles const& files, TSourcedStructure const& status, TSourcedStructure const& system) {
  TRecord record("ZEP_BootSettings", kSysfs, "CIM_SettingData");
  record.AddKey("InstanceID", "Boot");
  record.AddOwn("ElementName", "Boot");
  record.Add("IsUEFI", IsUefi(files));
  record.SetSource(kVariables);
  record.Add("SecureBoot", VariableOf(files, "SecureBoot"));
  record.Add("SecureBootSetupMode", VariableOf(files, "SetupMode"));
  record.SetSource("/proc/cmdline");
  record.Add("KernelCommandLine", files.Line("/proc/cmdline"));
  record.SetSource(status.fSource);
  record.Add("FirmwareBootStatus", status.fStructure.Byte(0x0a).Then(BootStatusFrom));
  record.SetSource(system.fSource);
  record.Add("WakeUpType", system.fStructure.Byte(0x18).Then(WakeUpTypeFrom));
  return record;
}

}  // namespace NQRVZEP20
