// SPDX-License-Identifier: Apache-2.0
#include "Attachment.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <sstream>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;
using TSpeed = TFinding<unsigned long>;

// A directory of a path, and the whole path up to it.
struct TStep {
  std::string fName, fPath;
};

std::vector<TStep> StepsOf(std::string const& path) {
  std::vector<TStep> steps;
  std::istringstream names(path);
  std::string above;
  for (std::string name; std::getline(names, name, '/');)
    if (!name.empty()) steps.push_back({name, above += "/" + name});
  return steps;
}

// The last step with a name such as "ata1": the beginning, followed by a digit.
TStep const* FindNumbered(std::vector<TStep> const& steps, std::string const& beginning) {
  auto const isWanted = [&](TStep const& step) {
    return step.fName.compare(0, beginning.size(), beginning) == 0 && step.fName.size() > beginning.size() &&
           std::isdigit(static_cast<unsigned char>(step.fName[beginning.size()]));
  };
  auto const found = std::find_if(steps.rbegin(), steps.rend(), isWanted);
  return found == steps.rend() ? nullptr : &*found;
}

bool IsNvme(TBlockDevice const& drive) { return drive.fName.rfind("nvme", 0) == 0; }

// The NVMe controller of a disk: its device, or, for a disk that several controllers can share, the first of the subsystem.
TText NvmeController(TMachineFiles const& files, std::string const& device) {
  if (files.Exists(device + "/transport")) return device;
  for (std::string const& name : files.Names(device))
    if (name.rfind("nvme", 0) == 0 && files.Exists(device + "/" + name + "/transport"))
      return files.RealPath(device + "/" + name);
  return TMissing{kMissingNotGiven, "sysfs shows no NVMe controller below " + device};
}

TText DevicePathOf(TMachineFiles const& files, TBlockDevice const& drive) {
  TText const device = files.RealPath(drive.File("device"));
  if (!device || !IsNvme(drive)) return device;
  return NvmeController(files, *device);
}

std::string LinkOf(TStep const& ataPort) { return "/sys/class/ata_link/link" + ataPort.fName.substr(3) + "/sata_spd"; }

// A parallel ATA port has no SATA speed.
std::string AtaTransport(TMachineFiles const& files, TStep const& ataPort) {
  TText const speed = files.Line(LinkOf(ataPort));
  return speed && *speed == "<unknown>" ? "ata" : "sata";
}

std::string CardTransport(TMachineFiles const& files, std::string const& device) {
  TText const type = files.Line(device + "/type");
  return type && *type == "SD" ? "sd" : "mmc";
}

struct TPathTransport {
  char const *fBeginning, *fTransport;
};
constexpr TPathTransport kPathTransports[] = {{"usb", "usb"},       {"end_device-", "sas"}, {"rport-", "fc"},
                                              {"session", "iscsi"}, {"virtio", "virtio"},   {"vbd-", "xen"},
                                              {"ufs", "ufs"}};

TText TransportOf(TMachineFiles const& files, TBlockDevice const& drive, std::string const& device) {
  if (IsNvme(drive)) return std::string("nvme");
  std::vector<TStep> const steps = StepsOf(device);
  if (FindNumbered(steps, "mmc") != nullptr) return CardTransport(files, device);
  for (TPathTransport const& row : kPathTransports)
    if (FindNumbered(steps, row.fBeginning) != nullptr) return std::string(row.fTransport);
  if (TStep const* const port = FindNumbered(steps, "ata")) return AtaTransport(files, *port);
  TStep const* const host = FindNumbered(steps, "host");
  if (host != nullptr && files.Exists("/sys/class/spi_host/" + host->fName)) return std::string("spi");
  return TMissing{kMissingNotGiven, "sysfs does not show by which transport " + drive.fName + " is attached"};
}

TSpeed ReadSpeed(TMachineFiles const& files, std::string const& file) {
  return files.Line(file).Then([&](std::string const& text) { return SpeedFrom(text, file); });
}

// Each port of a SAS drive has one or more links; all have the same speed.
TSpeed SasSpeed(TMachineFiles const& files, std::vector<TStep> const& steps) {
  if (TStep const* const port = FindNumbered(steps, "port-"))
    for (std::string const& name : files.Names(port->fPath))
      if (name.rfind("phy-", 0) == 0) return ReadSpeed(files, "/sys/class/sas_phy/" + name + "/negotiated_linkrate");
  return TMissing{kMissingNotGiven, "sysfs shows no link of the SAS drive"};
}

TSpeed UsbSpeed(TMachineFiles const& files, std::vector<TStep> const& steps) {
  for (auto step = steps.rbegin(); step != steps.rend(); ++step)
    if (files.Exists(step->fPath + "/busnum")) return ReadSpeed(files, step->fPath + "/speed");
  return TMissing{kMissingNotGiven, "sysfs shows no USB device above the drive"};
}

TSpeed PciSpeed(TMachineFiles const& files, TText const& pciPath) {
  if (!pciPath) return pciPath.Why();
  TSpeed const lane = ReadSpeed(files, *pciPath + "/current_link_speed");
  auto const lanes = files.Number<unsigned long>(*pciPath + "/current_link_width");
  if (!lane || !lanes) return !lane ? lane : lanes;
  if (*lanes == 0) return TMissing{kMissingNotGiven, *pciPath + "/current_link_width is 0"};
  return *lane * *lanes;
}

TSpeed SpeedOf(TMachineFiles const& files, TAttachment const& attachment) {
  if (!attachment.fTransport) return attachment.fTransport.Why();
  std::string const& transport = *attachment.fTransport;
  std::vector<TStep> const steps = StepsOf(*attachment.fDevicePath);
  if (transport == "sata") return ReadSpeed(files, LinkOf(*FindNumbered(steps, "ata")));
  if (transport == "sas") return SasSpeed(files, steps);
  if (transport == "usb") return UsbSpeed(files, steps);
  if (transport == "nvme") return PciSpeed(files, attachment.fPciPath);
  TStep const* const host = FindNumbered(steps, "host");
  if (transport == "fc" && host != nullptr) return ReadSpeed(files, "/sys/class/fc_host/" + host->fName + "/speed");
  return TMissing{kMissingNotGiven, "sysfs gives no link speed for the transport " + transport};
}

TText PciPathOf(std::string const& device) {
  std::vector<TStep> const steps = StepsOf(device);
  auto const found = std::find_if(steps.rbegin(), steps.rend(), [](TStep const& step) { return IsPciAddress(step.fName); });
  if (found == steps.rend()) return TMissing{kMissingNotGiven, "the drive is not attached through PCI: its path is " + device};
  return found->fPath;
}

}  // namespace

TText TAttachment::ScsiAddress() const {
  return fDevicePath.Then([](std::string const& path) -> TText {
    std::string const name = path.substr(path.rfind('/') + 1);
    bool const isAddress = std::count(name.begin(), name.end(), ':') == 3 && name.find_first_not_of("0123456789:") == name.npos;
    if (!isAddress) return TMissing{kMissingNotApplicable, "this is not a SCSI device"};
    return name;
  });
}

TAttachment AttachmentOf(TMachineFiles const& files, TBlockDevice const& drive) {
  TMissing const unknown{kMissingNotGiven, "not known"};
  TAttachment attachment{DevicePathOf(files, drive), unknown, unknown, unknown};
  attachment.fTransport =
      attachment.fDevicePath.Then([&](std::string const& device) { return TransportOf(files, drive, device); });
  attachment.fPciPath = attachment.fDevicePath.Then(PciPathOf);
  attachment.fSpeed = SpeedOf(files, attachment);
  return attachment;
}

TSpeed SpeedFrom(std::string const& text, std::string const& source) {
  double number = 0;
  auto const [rest, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  std::string unit(rest, text.data() + text.size());
  unit.erase(0, unit.find_first_not_of(' '));
  double const scale = unit.empty() || unit[0] == 'M' ? 1e6 : unit[0] == 'G' ? 1e9 : 0;
  constexpr double kLimit = 1e15;
  if (error != std::errc() || scale == 0 || !(number > 0 && number * scale < kLimit))
    return TMissing{kMissingNotGiven, source + " contains \"" + text + "\", which is not a speed"};
  return static_cast<unsigned long>(std::llround(number * scale));
}

bool IsPciAddress(std::string const& text) {
  constexpr char kForm[] = "xxxx:xx:xx.x";
  if (text.size() != sizeof kForm - 1) return false;
  for (std::size_t i = 0; i < text.size(); ++i) {
    bool const isHex = std::isxdigit(static_cast<unsigned char>(text[i])) != 0;
    if (kForm[i] == 'x' ? !isHex : text[i] != kForm[i]) return false;
  }
  return true;
}

}  // namespace NQRVZEP20
