// SPDX-License-Identifier: Apache-2.0
#include "ScsiRecords.h"

#include "TCIMSchemaHelper.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <tuple>

namespace NQRVZEP20 {

namespace {

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

std::vector<TAddress> AddressesIn(std::vector<std::string> const& names) {
  std::vector<TAddress> addresses;
  for (std::string const& name : names) {
    TAddress address{0, 0, 0, 0, name};
    int length = 0;
    std::sscanf(name.c_str(), "%u:%u:%u:%lu%n", &address.fHost, &address.fChannel, &address.fTarget, &address.fLun, &length);
    if (length > 0 && static_cast<std::size_t>(length) == name.size()) addresses.push_back(address);
  }
  std::sort(addresses.begin(), addresses.end());
  return addresses;
}

// The only line of a file of sysfs, without the blanks with which SCSI pads its texts.
TText ReadLine(TMachineFiles const& files, std::string const& file) {
  return files.Content(file).Then([](std::string const& content) -> TText {
    std::string const line = content.substr(0, content.find('\n'));
    std::size_t const first = line.find_first_not_of(' ');
    if (first == std::string::npos) return TMissing{kMissingNotGiven, "the device reports only blanks"};
    return line.substr(first, line.find_last_not_of(' ') - first + 1);
  });
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

TScsiPlace ScsiDirectory(TMachineFiles const& files) {
  char const* const named = std::getenv("ZEP_SCSI_DEVICES");
  if (named != nullptr && *named != '\0') return {TMachineFiles("/"), named};
  return {files, kKernelDirectory};
}

std::vector<TRecord> ScsiRecords(TScsiPlace const& directory, TSystemName const& name) {
  auto const& [files, path] = directory;
  std::vector<TRecord> records;
  for (TAddress const& address : AddressesIn(files.Names(path))) {
    std::string const device = path + "/" + address.fText + "/";
    TText const type = ReadLine(files, device + "type");
    if (!type) continue;
    records.push_back(MakeRecord(name, address.fText, type.Then(DeviceTypeFrom), ReadLine(files, device + "vendor"),
                                 ReadLine(files, device + "model"), ReadLine(files, device + "rev")));
  }
  return records;
}

TRecord ScsiShape(TSystemName const& name) {
  TText const none = TMissing();
  return MakeRecord(name, none, none, none, none, none);
}

TMissing WhyNoScsiDevices(TScsiPlace const& directory) {
  std::string const& path = directory.fPath;
  if (!directory.fFiles.Exists(path)) return {kMissingNotGiven, "the kernel lists no SCSI devices: " + path + " does not exist"};
  return {kMissingNotGiven, "no SCSI devices are listed in " + path};
}

}  // namespace NQRVZEP20
