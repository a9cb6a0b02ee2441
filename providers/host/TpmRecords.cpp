// SPDX-License-Identifier: Apache-2.0
#include "TpmRecords.h"

#include "SmbiosFields.h"
#include "TCIMSchemaHelper.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

std::string const kTpms = "/sys/class/tpm/";

// A TPM 1.2 reports its version in the file caps: "TCG version: 1.2".
TFinding<std::string> KernelVersionOf(TMachineFiles const& files, std::string const& directory) {
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

// Four characters, the unused ones zero.
TFinding<std::string> VendorOf(TSmbiosStructure const& module) {
  return module.Bytes(0x04, 4).Then([](std::vector<unsigned char> const& bytes) -> TFinding<std::string> {
    std::string const vendor(bytes.begin(), std::find(bytes.begin(), bytes.end(), 0));
    if (vendor.empty()) return Unknown();
    return vendor;
  });
}

std::string DottedNumbers(unsigned major, unsigned minor) { return std::to_string(major) + "." + std::to_string(minor); }

TFinding<std::string> VersionOf(TSmbiosStructure const& module) {
  return module.Byte(0x08).Then([&](std::uint8_t major) {
    return module.Byte(0x09).Then([major](std::uint8_t minor) { return DottedNumbers(major, minor); });
  });
}

// A TPM 1.2 has its version in two bytes, a TPM 2.0 in the halves of a number.
TFinding<std::string> FirmwareVersionOf(TSmbiosStructure const& module) {
  bool const isOld = IsNumber(module.Byte(0x08), std::uint8_t(1));
  return module.DWord(0x0a).Then([isOld](std::uint32_t number) {
    return isOld ? DottedNumbers(number >> 16 & 0xff, number >> 24) : DottedNumbers(number >> 16, number & 0xffff);
  });
}

TFinding<std::vector<std::string>> CharacteristicsFrom(std::uint64_t bits) {
  constexpr char const* words[] = {"Family configurable via firmware update", "Family configurable via platform software support",
                                   "Family configurable via OEM proprietary mechanism"};
  auto found = WordsFor(bits, words, 3);
  if (found.empty()) return Unknown();
  return found;
}

// The facts of the kernel about the module `id`, or why it has none.
struct TKernelTpm {
  TFinding<std::string> fDescription, fVersion;
  TFinding<std::vector<std::string>> fBanks;
};

TKernelTpm KernelTpm(TMachineFiles const& files, std::string const& id) {
  std::string const directory = kTpms + id + "/";
  return {files.Line(directory + "device/description"), KernelVersionOf(files, directory), BanksOf(files, directory)};
}

TKernelTpm KernelTpm(TMissing const& why) { return {why, why, why}; }

TRecord TpmRecord(TKernelTpm const& kernel, TSourcedStructure const& module, TSystemName const& name, std::string const& id) {
  auto const& [structure, source] = module;
  TRecord record("ZEP_TrustedPlatformModule", kTpms, "CIM_LogicalDevice");
  record.AddKey("SystemCreationClassName", TCIMSchemaHelper::kSystemCreationClassName);
  record.AddPropagatedKey("SystemName", name.fName);
  record.AddKey("CreationClassName", "ZEP_TrustedPlatformModule");
  record.AddKey("DeviceID", id);
  record.Add("ElementName", kernel.fDescription);
  record.Add("RegisterBanks", kernel.fBanks);
  if (!kernel.fVersion) record.SetSource(source);
  record.Add("SpecificationVersion", kernel.fVersion ? kernel.fVersion : VersionOf(structure));
  record.SetSource(source);
  record.Add("Description", TextOf(structure, 0x12));
  record.Add("Vendor", VendorOf(structure));
  record.Add("FirmwareVersion", FirmwareVersionOf(structure));
  record.Add("Characteristics", structure.QWord(0x13).Then(CharacteristicsFrom));
  return record;
}

}  // namespace

std::vector<TRecord> TpmRecords(TFinding<TMachineFiles> const& files, std::vector<TSmbiosStructure> const& structures,
                                TSourcedStructure const& absent, TSystemName const& name) {
  auto const ids = files ? files->Names(kTpms) : std::vector<std::string>();
  TMissing const whyNot = files ? TMissing{kMissingNotGiven, "the kernel does not list the module in " + kTpms} : files.Why();
  std::vector<TRecord> records;
  for (std::size_t at = 0; at < std::max(ids.size(), structures.size()); ++at) {
    TSourcedStructure const structure = at < structures.size() ? TSourcedStructure{structures[at], absent.fSource} : absent;
    records.push_back(at < ids.size() ? TpmRecord(KernelTpm(*files, ids[at]), structure, name, ids[at])
                                      : TpmRecord(KernelTpm(whyNot), structure, name, "TPM " + std::to_string(at)));
  }
  return records;
}

TRecord TpmShape(TSourcedStructure const& absent, TSystemName const& name) {
  return TpmRecord(KernelTpm(TMissing{}), absent, name, "");
}

}  // namespace NQRVZEP20
