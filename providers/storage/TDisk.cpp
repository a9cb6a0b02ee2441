// SPDX-License-Identifier: Apache-2.0
#include "TDisk.h"

#include <algorithm>
#include <functional>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

// The first finding with a value; if there is none, the last one, whose reason is the most specific.
template <class T>
TFinding<T> FirstOf(std::vector<TFinding<T>> const& findings) {
  auto const found = std::find_if(findings.begin(), findings.end(), [](TFinding<T> const& finding) { return bool(finding); });
  return found != findings.end() ? *found : findings.back();
}

std::string PageOf(TMachineFiles const& files, std::string const& device, char const* page) {
  auto const content = files.Content(device + "/vpd_" + page);
  return content ? *content : "";
}

// "naa.5000c500..." and "eui.00a0...", as the files "wwid" of the kernel state them.
bool AddWwid(TText const& wwid, std::vector<TDesignator>& designators) {
  struct TPrefix {
    char const *fPrefix, *fFormat;
  };
  constexpr TPrefix kPrefixes[] = {{"naa.", "NAA"}, {"eui.", "EUI64"}, {"uuid.", "UUID"}, {"0x", "NAA"}, {"nvme.", "NVMe"}};
  if (!wwid) return false;
  for (TPrefix const& row : kPrefixes) {
    std::string const prefix = row.fPrefix;
    if (wwid->compare(0, prefix.size(), prefix) != 0) continue;
    designators.push_back({row.fFormat, wwid->substr(prefix.size())});
    return true;
  }
  return false;
}

std::vector<TDesignator> SortedByFormat(std::vector<TDesignator> designators) {
  auto const isText = [](TDesignator const& designator) { return designator.fFormat == "T10 vendor ID"; };
  std::stable_partition(designators.begin(), designators.end(),
                        [&](TDesignator const& designator) { return !isText(designator); });
  return designators;
}

// The serial number of the USB device that a drive is part of.
TText UsbSerialNumber(TMachineFiles const& files, std::string path) {
  for (; path.size() > 1; path.erase(path.rfind('/')))
    if (files.Exists(path + "/busnum")) return files.Line(path + "/serial");
  return TMissing{kMissingNotGiven, "the drive reports no serial number"};
}

void ReadScsi(TMachineFiles const& files, std::string const& device, TDisk& disk) {
  TAtaIdentity const ata = AtaIdentityFrom(PageOf(files, device, "pg89"));
  TCharacteristics const characteristics = CharacteristicsFrom(PageOf(files, device, "pgb1"));
  bool const isAta = files.Exists(device + "/vpd_pg89") || disk.fUdev.Value("ID_ATA");
  TMissing const notAta{kMissingNotGiven, "this is not an ATA disk"};
  TText const udevModel = isAta ? disk.fUdev.DecodedValue("ID_MODEL_ENC") : TText(notAta);
  TText const udevFirmware = isAta ? disk.fUdev.Value("ID_REVISION") : TText(notAta);
  if (isAta)
    disk.fVendor = TMissing{kMissingNotApplicable, "an ATA disk reports its maker only as part of its model"};
  else
    disk.fVendor = files.Line(device + "/vendor");
  disk.fModel = FirstOf<std::string>({ata.fModel, udevModel, files.Line(device + "/model")});
  disk.fFirmware = FirstOf<std::string>({ata.fFirmware, udevFirmware, files.Line(device + "/rev")});
  disk.fSerialNumber = FirstOf<std::string>({SerialNumberFrom(PageOf(files, device, "pg80")), ata.fSerialNumber,
                                             disk.fUdev.Value("ID_SCSI_SERIAL"), disk.fUdev.Value("ID_SERIAL_SHORT"),
                                             UsbSerialNumber(files, device)});
  disk.fRotationsPerMinute = FirstOf<unsigned>({ata.fRotationsPerMinute, characteristics.fRotationsPerMinute});
  disk.fFormFactor = FirstOf<unsigned>({ata.fFormFactor, characteristics.fFormFactor});
  disk.fDesignators = DesignatorsFrom(PageOf(files, device, "pg83"));
  if (disk.fDesignators.empty() && !AddWwid(files.Line(device + "/wwid"), disk.fDesignators))
    AddWwid(disk.fUdev.Value("ID_WWN_WITH_EXTENSION"), disk.fDesignators);
  disk.fDesignators = SortedByFormat(disk.fDesignators);
  disk.fState = files.Line(device + "/state");
}

void ReadNvme(TMachineFiles const& files, std::string const& device, TDisk& disk) {
  disk.fVendor = TMissing{kMissingNotApplicable, "an NVMe disk reports its maker only as part of its model"};
  disk.fModel = files.Line(device + "/model");
  disk.fSerialNumber = files.Line(device + "/serial");
  disk.fFirmware = files.Line(device + "/firmware_rev");
  disk.fState = files.Line(device + "/state");
  disk.fRotationsPerMinute = 0U;
  AddWwid(files.Line(disk.fDevice.File("wwid")), disk.fDesignators);
}

void ReadCard(TMachineFiles const& files, std::string const& device, TDisk& disk) {
  disk.fModel = files.Line(device + "/name");
  disk.fSerialNumber = files.Line(device + "/serial");
  disk.fFirmware = files.Line(device + "/fwrev");
  disk.fVendor = files.Line(device + "/manfid").Then([](std::string const& number) -> TText {
    return TMissing{kMissingNotGiven, "the card reports its maker only as the number " + number};
  });
  disk.fRotationsPerMinute = 0U;
}

void ReadOther(TMachineFiles const& files, TDisk& disk) {
  disk.fModel = disk.fUdev.DecodedValue("ID_MODEL_ENC");
  disk.fSerialNumber = FirstOf<std::string>({files.Line(disk.fDevice.File("serial")), disk.fUdev.Value("ID_SERIAL_SHORT")});
}

TMissing NotReported(char const* fact) {
  return {kMissingNotGiven, std::string("neither the drive nor the kernel reports the ") + fact};
}

}  // namespace

TDisk DiskOf(TMachineFiles const& files, TBlockDevice const& drive, TUdevRecord const& udev) {
  TDisk disk{drive,
             udev,
             AttachmentOf(files, drive),
             NotReported("maker"),
             NotReported("model"),
             NotReported("serial number"),
             NotReported("firmware version"),
             NotReported("state"),
             NotReported("rotation rate"),
             NotReported("form factor"),
             {}};
  if (!disk.fAttachment.fDevicePath) return disk;
  std::string const& device = *disk.fAttachment.fDevicePath;
  TText const& transport = disk.fAttachment.fTransport;
  if (transport && *transport == "nvme")
    ReadNvme(files, device, disk);
  else if (transport && (*transport == "mmc" || *transport == "sd"))
    ReadCard(files, device, disk);
  else if (disk.fAttachment.ScsiAddress())
    ReadScsi(files, device, disk);
  else
    ReadOther(files, disk);
  return disk;
}

}  // namespace NQRVZEP20
