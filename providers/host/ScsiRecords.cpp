// SPDX-License-Identifier: Apache-2.0
#include "ScsiRecords.h"

#include "TCIMSchemaHelper.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <tuple>

namespace NQRVZEP20 {

namespace {

namespace fs = std::filesystem;
using TText = TFinding<std::string>;

constexpr char const* kClassName = "QRVSG_SCSIDevice";
constexpr char const* kKernelDirectory = "/sys/bus/scsi/devices";

// The peripheral device types of the SCSI standard, by number.
constexpr char const* kDeviceTypes[] = {
    "Direct Access Device",
    "Sequential Access Device",
    "Printer Device",
    "Processor Device",
    "Write Once Device",
    "CD-ROM Device",
    "Scanner Device",
    "Optical Memory Device",
    "Medium Changer Device",
    "Communications Device",
    "Graphic Arts Device",
    "Graphic Arts Device",
    "Storage Array Controller Device",
    "Enclosure Services Device",
    "Simplified Direct Access Device",
    "Optical Card Device",
};

// "1:0:0:0": the host, channel, target and logical unit of a device. The directory also contains hosts and targets, whose names
// have other forms.
struct TAddress {
  unsigned fHost, fChannel, fTarget;
  unsigned long fLun;
  std::string fText;
};

bool operator<(TAddress const& a, TAddress const& b) {
  return std::tie(a.fHost, a.fChannel, a.fTarget, a.fLun) < std::tie(b.fHost, b.fChannel, b.fTarget, b.fLun);
}

std::vector<TAddress> AddressesIn(std::string const& directory) {
  std::vector<TAddress> addresses;
  std::error_code error;
  for (fs::directory_iterator entry(directory, error), end; !error && entry != end; entry.increment(error)) {
    TAddress address{0, 0, 0, 0, entry->path().filename().string()};
    int length = 0;
    std::sscanf(address.fText.c_str(), "%u:%u:%u:%lu%n", &address.fHost, &address.fChannel, &address.fTarget, &address.fLun,
                &length);
    if (length > 0 && static_cast<std::size_t>(length) == address.fText.size()) addresses.push_back(address);
  }
  std::sort(addresses.begin(), addresses.end());
  return addresses;
}

// The only line of a file of sysfs, without the blanks with which SCSI pads its texts.
TText ReadLine(std::string const& file) {
  std::ifstream stream(file);
  std::string line;
  if (!std::getline(stream, line)) return TMissing{kMissingUnreadable, file + " cannot be read"};
  std::size_t const first = line.find_first_not_of(' ');
  if (first == std::string::npos) return TMissing{kMissingNotGiven, "the device reports only blanks"};
  return line.substr(first, line.find_last_not_of(' ') - first + 1);
}

TText DeviceTypeFrom(std::string const& number) {
  char* end = nullptr;
  unsigned long const type = std::strtoul(number.c_str(), &end, 10);
  if (*end != '\0' || type > 0x1f) return TMissing{kMissingUnexpected, "\"" + number + "\" is not a SCSI device type"};
  return type < std::size(kDeviceTypes) ? std::string(kDeviceTypes[type]) : "Unknown Device, type " + std::to_string(type);
}

TRecord MakeRecord(TSystemName const& name, TText const& id, TText const& type, TText const& vendor, TText const& product,
                   TText const& revision) {
  TRecord record(kClassName, "sysfs", "CIM_LogicalDevice");
  record.AddKey("SystemCreationClassName", TCIMSchemaHelper::kSystemCreationClassName);
  record.AddPropagatedKey("SystemName", name.fName);
  record.AddKey("CreationClassName", kClassName);
  record.AddKey("DeviceID", id);
  record.Add("DeviceType", type);
  record.Add("VendorID", vendor);
  record.Add("ProductID", product);
  record.Add("ProductRevision", revision);
  return record;
}

}  // namespace

std::string ScsiDirectory(TMachineFiles const& files) {
  char const* const named = std::getenv("ZEP_SCSI_DEVICES");
  return named != nullptr && *named != '\0' ? named : files.Outside(kKernelDirectory);
}

std::vector<TRecord> ScsiRecords(std::string const& directory, TSystemName const& name) {
  std::vector<TRecord> records;
  for (TAddress const& address : AddressesIn(directory)) {
    std::string const device = directory + "/" + address.fText + "/";
    TText const type = ReadLine(device + "type");
    if (!type) continue;
    records.push_back(MakeRecord(name, address.fText, type.Then(DeviceTypeFrom), ReadLine(device + "vendor"),
                                 ReadLine(device + "model"), ReadLine(device + "rev")));
  }
  return records;
}

TRecord ScsiShape(TSystemName const& name) {
  TText const none = TMissing();
  return MakeRecord(name, none, none, none, none, none);
}

TMissing WhyNoScsiDevices(std::string const& directory) {
  if (!fs::exists(directory)) return {kMissingNotGiven, "the kernel lists no SCSI devices: " + directory + " does not exist"};
  return {kMissingNotGiven, "no SCSI devices are listed in " + directory};
}

}  // namespace NQRVZEP20
