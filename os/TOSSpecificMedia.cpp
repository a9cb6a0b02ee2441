// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMNamespace.h"
#include "ICIMProperty.h"
#include "TAddToVectorCallback.h"
#include "TZEPException.h"
#include "core/Handles.h"
#include "core/Log.h"
#include "os/MediaTexts.h"

#include <fcntl.h>
#include <scsi/scsi.h>
#include <scsi/sg.h>
#include <sys/ioctl.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <filesystem>

namespace NQRVZEP20 {
namespace {

bool Succeeds(std::string const& command) { return std::system(command.c_str()) == 0; }

// ---- The controller's virtual devices ----

constexpr int kProbeTimeoutSeconds = 300;
constexpr int kCdRom = 1;

// The hwinfo query for devices of one kind, and the marks of virtual ones in its output.
struct TProbe {
  char const* fHeader;
  char const* fMarker;
  char const* fOption;
};

constexpr TProbe kProbes[] = {
    {"Hardware Class: disk", "Virtual", "--disk"},
    {"Hardware Class: cdrom", "0x4012", "--cdrom"},
    {"Hardware Class: keyboard", "0x4012", "--keyboard"},
    {"Hardware Class: mouse", "0x4012", "--mouse"},
};

// ---- Disks in the namespace ----

// A disk as the namespace describes it.
struct TDisk {
  std::string fProduct, fId, fVendor;

  std::string Identifier() const { return fVendor + " - " + fProduct + " - " + fId; }
  std::string Description() const { return fVendor + (fVendor.empty() || fProduct.empty() ? "" : " ") + fProduct; }
};

// Empty for a property that is NULL or missing.
std::string ReadText(ICIMInstance const& instance, std::string const& property) {
  auto const found = instance.GetProperty(property, TCIMContext());
  if (!found) return "";
  TCIMValue const value = found->GetValue(TCIMContext());
  return value.IsNull() ? "" : value.operator std::string();
}

std::vector<TDisk> ReadDisks(ICIMNamespace const& ns) {
  std::vector<boost::shared_ptr<ICIMInstance>> instances;
  ns.GetClass("QRVSG_SCSIDevice", TCIMContext())
      ->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), TCIMContext());
  std::vector<TDisk> disks;
  for (auto const& instance : instances) {
    std::string const type = ReadText(*instance, "DeviceType");
    std::string const product = ReadText(*instance, "ProductID");
    std::string const id = ReadText(*instance, "DeviceID");
    std::string const vendor = ReadText(*instance, "VendorID");
    if (type == "Direct Access Device") disks.push_back({product, id, vendor});
  }
  return disks;
}

// ---- Disks in the kernel ----

// Empty, with the reason in the log, when the file cannot be read.
std::string CaptureWherePossible(std::string const& file) {
  try {
    return TOSSpecific::CaptureFile(file);
  } catch (TZEPException const&) {
    return "";
  }
}

// The kernel's list of USB devices. Current kernels have it under the second path.
std::string ReadUsbDevices() {
  std::string list = CaptureWherePossible("/proc/bus/usb/devices");
  return list.empty() ? CaptureWherePossible("/sys/kernel/debug/usb/devices") : list;
}

// Queries an open node for its address. The first two requests are for disks, the third is for generic nodes.
std::optional<TScsiAddress> AskDisk(int fd) {
  struct {
    std::uint32_t fIdLun;  // from the lowest byte: target, lun, channel, host
    std::uint32_t fUniqueHostId;
  } ids;
  int host;
  if (::ioctl(fd, SCSI_IOCTL_GET_IDLUN, &ids) < 0 || ::ioctl(fd, SCSI_IOCTL_GET_BUS_NUMBER, &host) < 0) return std::nullopt;
  auto const byte = [&](unsigned int number) { return static_cast<int>(ids.fIdLun >> (8 * number) & 0xff); };
  return TScsiAddress{host, byte(2), byte(0), byte(1)};
}

std::optional<TScsiAddress> AskGeneric(int fd) {
  sg_scsi_id id;
  if (::ioctl(fd, SG_GET_SCSI_ID, &id) < 0) return std::nullopt;
  return TScsiAddress{id.host_no, id.channel, id.scsi_id, id.lun};
}

// Returns nothing, with the reason in the log, when the device does not answer.
template <class TAsk>
std::optional<TScsiAddress> AddressOfNode(std::string const& node, TAsk ask) {
  TUniqueFd const fd(::open(node.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
  if (!fd) {
    LogDebug("Failed opening ", node);
    return std::nullopt;
  }
  std::optional<TScsiAddress> const address = ask(fd.get());
  if (!address) LogDebug("Failed ioctl on ", node);
  return address;
}

struct TNode {
  std::string fName;  // "sdb"
  TScsiAddress fAddress;

  std::string Path() const { return "/dev/" + fName; }
};

std::vector<TNode> AskDiskNodes() {
  std::vector<TNode> nodes;
  for (char letter = 'a'; letter <= 'z'; ++letter) {
    std::string const name = std::string("sd") + letter;
    if (auto const address = AddressOfNode("/dev/" + name, AskDisk)) nodes.push_back({name, *address});
  }
  return nodes;
}

// The USB device above a disk in sysfs.
std::optional<TUsbDevice> UsbDeviceAbove(TNode const& node) {
  std::error_code error;
  std::filesystem::path place = std::filesystem::canonical("/sys/class/block/" + node.fName + "/device", error);
  for (; place.has_relative_path(); place = place.parent_path()) {
    std::ifstream bus(place / "busnum"), device(place / "devnum");
    TUsbDevice usb;
    if (bus >> usb.fBus && device >> usb.fDevice) return usb;
  }
  return std::nullopt;
}

// If sysfs does not list the disk, the word "USB" anywhere in the list decides.
bool IsUsbDisk(TNode const& node, std::string const& usbDevices) {
  if (auto const usb = UsbDeviceAbove(node)) return usbDevices.empty() || Lists(usbDevices, *usb);
  bool const isKnownNotToBe = TOSSpecific::DirExists("/sys/class/block/" + node.fName);
  return !isKnownNotToBe && usbDevices.find("USB") != std::string::npos;
}

// ---- The two brought together ----

// The node of a disk; null, with a line in the log, when it has none.
TNode const* NodeOf(TDisk const& disk, std::vector<TNode> const& nodes) {
  bool const isGenericNode = disk.fId.compare(0, 7, "/dev/sg") == 0;
  auto const address = isGenericNode ? AddressOfNode(disk.fId, AskGeneric) : ScsiAddressFrom(disk.fId);
  auto const isThere = [&](TNode const& node) { return address && node.fAddress == *address; };
  auto const found = std::find_if(nodes.begin(), nodes.end(), isThere);
  if (found != nodes.end()) return &*found;
  LogDebug("No mapping found for ", disk.Identifier());
  return nullptr;
}

// The mount point, or nothing, with a line in the log, when the device cannot be mounted.
std::string MountWherePossible(std::string const& device) {
  try {
    if (!TOSSpecific::DirExists(kKeyMountPoint)) TOSSpecific::CreateDir(kKeyMountPoint);
    return TOSSpecific::MountDevice(device);
  } catch (TZEPException const& failure) {
    LogDebug("Failed mounting ", device, ": ", failure.what());
    return "";
  }
}

void AddFloppyDrive(std::vector<TRemovableMedium>& media) {
  auto const drive = std::find_if(std::begin(kFloppyDevices), std::end(kFloppyDevices), TOSSpecific::FileExists);
  if (drive != std::end(kFloppyDevices)) media.push_back({*drive, "Built-in Floppy Drive", kFloppyMountPoint});
}

}  // namespace

std::string TOSSpecific::MountDevice(std::string device) {
  std::string const mountPoint = MountPointOf(device);
  // Anything that is mounted there already stays, and is accepted. Kept.
  if (Succeeds("mount | grep \"" + mountPoint + " type\" >/dev/null")) return mountPoint;
  if (Succeeds("mount " + device + " " + mountPoint + " 2>/dev/null")) return mountPoint;
  if (Succeeds("mount " + device + "1 " + mountPoint + " 2>/dev/null")) return mountPoint;
  throw TZEPException(kZEPStatusFileSystemError);
}

// The device is ignored; only the mount point is used. Kept.
void TOSSpecific::UnmountDevice(std::string, std::string mountPoint) {
  if (!Succeeds("umount " + mountPoint + " 2> /dev/null")) throw TZEPException(kZEPStatusFileSystemError);
}

void TOSSpecific::getxBMCVirtualDevices(int kind, std::vector<std::string>& devices, bool keepWhole) {
  if (kind < 0 || kind >= static_cast<int>(std::size(kProbes))) return;
  TProbe const& probe = kProbes[kind];
  std::string const output = SpawnProcess("hwinfo", std::vector<std::string>{probe.fOption}, kProbeTimeoutSeconds);
  // A CD-ROM's alias is removed even when the caller wants the complete text. Kept.
  bool const hasAlias = keepWhole && kind != kCdRom;
  for (std::string const& found : DeviceFilesIn(output, probe.fHeader, probe.fMarker)) {
    std::string const file = hasAlias ? found : WithoutAlias(found);
    if (!file.empty()) devices.push_back(file);
  }
}

std::vector<TRemovableMedium> TOSSpecific::EnumerateRemovableMedia(boost::shared_ptr<ICIMNamespace> ns) {
  std::string const usbDevices = ReadUsbDevices();
  std::vector<TDisk> const disks = ReadDisks(*ns);
  std::vector<TNode> const nodes = AskDiskNodes();

  std::vector<TRemovableMedium> media;
  for (TDisk const& disk : disks) {
    TNode const* const node = NodeOf(disk, nodes);
    if (node == nullptr || !IsUsbDisk(*node, usbDevices)) continue;
    media.push_back({node->Path(), disk.Description(), MountWherePossible(node->Path())});
  }
  AddFloppyDrive(media);
  return media;
}

}  // namespace NQRVZEP20
