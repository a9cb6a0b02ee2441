// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/media/Media.h"

#include "TOSSpecific.h"
#include "core/Handles.h"
#include "os/MediaTexts.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"

#include <fcntl.h>
#include <linux/cdrom.h>
#include <sys/ioctl.h>
#include <sys/sysmacros.h>

#include <algorithm>
#include <cerrno>
#include <fstream>
#include <iterator>
#include <sstream>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

constexpr int kTimeoutSeconds = 60;
constexpr char const* kPlainCharacters = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789/-_.";

// ---- lsblk ----

std::string TextOf(TJson const& node, char const* key) {
  auto const found = node.find(key);
  return found != node.end() && found->is_string() ? found->get<std::string>() : "";
}

bool FlagOf(TJson const& node, char const* key) {
  auto const found = node.find(key);
  return found != node.end() && found->is_boolean() && found->get<bool>();
}

bool IsRemovable(TJson const& drive) {
  std::string const type = TextOf(drive, "type");
  return (type == "disk" || type == "rom") && (FlagOf(drive, "rm") || TextOf(drive, "tran") == "usb");
}

std::string DescriptionOf(TJson const& drive) {
  std::string const vendor = Trimmed(TextOf(drive, "vendor"));
  std::string const model = Trimmed(TextOf(drive, "model"));
  if (vendor.empty() || model.rfind(vendor, 0) == 0) return model;
  return vendor + (model.empty() ? "" : " ") + model;
}

bool IsPartition(TJson const& node) { return TextOf(node, "type") == "part"; }

// Includes the mount points of an opened encrypted or logical volume, which is a child of its partition.
void AddMountPoints(TJson const& node, std::vector<std::string>& mountPoints) {
  for (TJson const& mountPoint : node.value("mountpoints", TJson::array()))
    if (mountPoint.is_string()) mountPoints.push_back(mountPoint);
  for (TJson const& child : node.value("children", TJson::array()))
    if (!IsPartition(child)) AddMountPoints(child, mountPoints);
}

TMedium MediumFrom(TJson const& node, std::string const& description) {
  TMedium medium{};
  medium.fDevice = TextOf(node, "name");
  medium.fDescription = description;
  medium.fLabel = TextOf(node, "label");
  medium.fFileSystem = TextOf(node, "fstype");
  if (auto const size = node.find("size"); size != node.end() && size->is_number_unsigned()) medium.fSize = *size;
  medium.fIsReadOnly = FlagOf(node, "ro");
  AddMountPoints(node, medium.fMountPoints);
  medium.fIsOptical = TextOf(node, "type") == "rom";
  return medium;
}

// Adds every partition, and the drive itself when it has no partitions or has a file system of its own.
void AddMediaOf(TJson const& drive, std::vector<TMedium>& media) {
  TJson const children = drive.value("children", TJson::array());
  TMedium const whole = MediumFrom(drive, DescriptionOf(drive));
  if (std::none_of(children.begin(), children.end(), IsPartition) || !whole.fFileSystem.empty()) media.push_back(whole);
  for (TJson const& child : children)
    if (IsPartition(child)) media.push_back(MediumFrom(child, whole.fDescription));
}

// Whether the medium is an optical drive that is empty. The query does not move the tray.
bool IsEmptyDrive(TMedium const& medium) {
  if (!medium.fIsOptical) return false;
  TUniqueFd const drive(::open(medium.fDevice.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
  if (!drive) return errno == ENOMEDIUM;
  int const status = ::ioctl(drive.get(), CDROM_DRIVE_STATUS, CDSL_CURRENT);
  return status == CDS_NO_DISC || status == CDS_TRAY_OPEN;
}

bool HasUdev() { return TOSSpecific::DirExists("/run/udev/data"); }

// ---- mountinfo ----

// The kernel writes a blank as "\040", and some other characters in the same way.
std::string WithoutEscapes(std::string const& text) {
  std::string plain;
  for (std::size_t at = 0; at < text.size(); ++at) {
    bool const isEscape = text[at] == '\\' && text.find_first_not_of("01234567", at + 1) - at > 3 && at + 3 < text.size();
    plain += isEscape ? static_cast<char>(std::stoi(text.substr(at + 1, 3), nullptr, 8)) : text[at];
    if (isEscape) at += 3;
  }
  return plain;
}

bool HasOption(std::string const& options, std::string const& option) {
  return ("," + options + ",").find("," + option + ",") != std::string::npos;
}

}  // namespace

bool IsPlainPath(std::string const& name) {
  return !name.empty() && name[0] == '/' && name.find_first_not_of(kPlainCharacters) == name.npos &&
         (name + "/").find("/./") == name.npos && (name + "/").find("/../") == name.npos;
}

std::string WithoutTrailingSlashes(std::string name) {
  while (name.size() > 1 && name.back() == '/') name.pop_back();
  return name;
}

void CheckDevice(std::string const& device) {
  if (device.find('@') != device.npos) throw TWrongUsage("the argument is not a device name");  // it may contain a password
  if (device.rfind("/dev/", 0) != 0 || !IsPlainPath(device))
    throw TWrongUsage("\"" + device +
                      "\" is not a device name: it must be a path below /dev of letters, digits, \"/\", \"-\", \"_\" and \".\"");
  if (!TOSSpecific::FileExists(device)) throw std::runtime_error("the device " + device + " does not exist");
}

std::vector<TMedium> MediaIn(std::string const& lsblkOutput) {
  std::size_t const start = lsblkOutput.find('{');  // warnings may precede the document
  TJson const document = TJson::parse(start == lsblkOutput.npos ? "" : lsblkOutput.substr(start), nullptr, false);
  if (!document.is_object() || !document.contains("blockdevices") || !document["blockdevices"].is_array())
    throw std::runtime_error("lsblk did not print its list as JSON, but: " + lsblkOutput);
  std::vector<TMedium> media;
  for (TJson const& drive : document["blockdevices"])
    if (drive.is_object() && IsRemovable(drive)) AddMediaOf(drive, media);
  return media;
}

void ReadLabel(std::string const& blkidOutput, TMedium& medium) {
  std::istringstream lines(blkidOutput);
  for (std::string line; std::getline(lines, line);) {
    if (line.rfind("LABEL=", 0) == 0) medium.fLabel = line.substr(6);
    if (line.rfind("TYPE=", 0) == 0) medium.fFileSystem = line.substr(5);
  }
}

std::vector<TMedium> FindMedia() {
  std::string output;
  std::vector<std::string> const arguments = {"--json", "--bytes", "--paths", "--output",
                                              "NAME,TYPE,SIZE,LABEL,FSTYPE,RM,RO,TRAN,MOUNTPOINTS,VENDOR,MODEL"};
  if (TOSSpecific::SpawnProcess("lsblk", arguments, output, kTimeoutSeconds) != 0)
    throw std::runtime_error(output.empty() ? "lsblk is missing, or failed without a message; it is in the package util-linux"
                                            : "lsblk failed: " + output.substr(0, output.find('\n')));
  std::vector<TMedium> media = MediaIn(output);
  media.erase(std::remove_if(media.begin(), media.end(), IsEmptyDrive), media.end());

  // lsblk gets labels from udev. Without udev, root reads them.
  if (!HasUdev() && TOSSpecific::IsAdmin())
    for (TMedium& medium : media)
      ReadLabel(TOSSpecific::SpawnProcess("blkid", {"-p", "-o", "export", medium.fDevice}, kTimeoutSeconds), medium);
  return media;
}

bool AreLabelsReadable() { return TOSSpecific::IsAdmin() || HasUdev(); }

std::vector<TMount> MountsIn(std::string const& mountInfo) {
  std::vector<TMount> mounts;
  std::istringstream lines(mountInfo);
  for (std::string line; std::getline(lines, line);) {
    // "36 35 8:17 / /mnt/key rw,noatime shared:1 - vfat /dev/sdb1 rw"
    std::istringstream fields(line);
    std::string id, parent, root, mountPoint, options, optional, type, source, superOptions;
    unsigned major = 0, minor = 0;
    char colon = 0;
    fields >> id >> parent >> major >> colon >> minor >> root >> mountPoint >> options;
    while (fields >> optional && optional != "-") continue;
    if (!(fields >> type >> source >> superOptions)) continue;
    mounts.push_back({WithoutEscapes(mountPoint), WithoutEscapes(source), ::gnu_dev_makedev(major, minor),
                      HasOption(options, "ro") || HasOption(superOptions, "ro")});
  }
  return mounts;
}

std::vector<TMount> Mounts() { return MountsIn(TOSSpecific::CaptureFile("/proc/self/mountinfo")); }

std::optional<TMount> MountIn(std::string const& mountInfo, std::string const& directory) {
  std::optional<TMount> topmost;
  for (TMount const& mount : MountsIn(mountInfo))
    if (mount.fMountPoint == directory) topmost = mount;
  return topmost;
}

std::optional<TMount> MountAt(std::string const& directory) {
  return MountIn(TOSSpecific::CaptureFile("/proc/self/mountinfo"), directory);
}

}  // namespace NQRVZEP20::zep
