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
std::string const kTpms = "/sys/class/tpm/";

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

// A TPM 1.2 reports its version in the file caps: "TCG version: 1.2".
TFinding<std::string> TpmVersionOf(TMachineFiles const& files, std::string const& directory) {
  auto const major = files.Line(directory + "tpm_version_major");
  if (major) return *major == "1" ? std::string("1.2") : *major + ".0";
  auto const caps = files.Content(directory + "caps");
  if (!caps) return major.Why();
  std::string const name = "TCG version: ";
  std::size_t const at = caps->find(name);
  if (at == std::string::npos) return TMissing{kMissingNotGiven, directory + "caps contains no version"};
  std::size_t const start = at + name.size();
  return caps->substr(start, caps->find('\n', start) - start);
}

// The hash algorithms whose registers the kernel lists: pcr-sha256.
std::vector<std::string> BanksOf(TMachineFiles const& files, std::string const& directory) {
  std::vector<std::string> banks;
  for (std::string const& name : files.Names(directory))
    if (name.compare(0, 4, "pcr-") == 0) banks.push_back(name.substr(4));
  return banks;
}

TRecord TpmRecord(TMachineFiles const& files, TSystemName const& name, std::string const& id) {
  std::string const directory = kTpms + id + "/";
  TRecord record("ZEP_TrustedPlatformModule", kTpms, "CIM_LogicalDevice");
  record.AddKey("SystemCreationClassName", TCIMSchemaHelper::kSystemCreationClassName);
  record.AddPropagatedKey("SystemName", name.fName);
  record.AddKey("CreationClassName", "ZEP_TrustedPlatformModule");
  record.AddKey("DeviceID", id);
  record.Add("ElementName", files.Line(directory + "device/description"));
  record.Add("SpecificationVersion", TpmVersionOf(files, directory));
  record.Add("RegisterBanks", TFinding<std::vector<std::string>>(BanksOf(files, directory)));
  return record;
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

std::vector<TRecord> TpmRecords(TMachineFiles const& files, TSystemName const& name) {
  std::vector<TRecord> records;
  for (std::string const& id : files.Names(kTpms)) records.push_back(TpmRecord(files, name, id));
  return records;
}

TRecord TpmShape(TSystemName const& name) { return TpmRecord(TMachineFiles("/nonexistent"), name, ""); }

}  // namespace NQRVZEP20
