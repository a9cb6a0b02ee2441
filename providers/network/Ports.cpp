// SPDX-License-Identifier: Apache-2.0
#include "Ports.h"

#include <linux/if_arp.h>

namespace NQRVZEP20 {

namespace {

// sysfs reports the speed in Mbit/s, and -1 for an unknown speed.
TFinding<std::uint64_t> SpeedInSysfs(TLinkFiles const& files) {
  return files.Number<std::int64_t>("speed").Then([](std::int64_t speed) -> TFinding<std::uint64_t> {
    if (speed <= 0 || speed >= UINT32_MAX) return TMissing{kMissingNotGiven, "the driver reports the speed as unknown"};
    return static_cast<std::uint64_t>(speed) * 1'000'000;
  });
}

TFinding<bool> DuplexInSysfs(TLinkFiles const& files) {
  return files.Line("duplex").Then([](std::string const& word) -> TFinding<bool> {
    if (word != "full" && word != "half") return TMissing{kMissingNotGiven, "the driver reports the duplex mode as unknown"};
    return word == "full";
  });
}

TLinkSettings SettingsOf(TMachineFiles const& files, TLink const& link) {
  auto const answer = AskLinkSettings(files, link.fName);
  TLinkSettings settings(answer);
  if (!answer) {
    settings.fSpeed = SpeedInSysfs({files, link});
    settings.fIsFullDuplex = DuplexInSysfs({files, link});
  }
  bool const isDown = link.fHasCarrier && !*link.fHasCarrier;
  if (!settings.fSpeed && isDown) settings.fSpeed = TMissing{kMissingNotGiven, "the port has no carrier"};
  if (!settings.fIsFullDuplex && isDown) settings.fIsFullDuplex = TMissing{kMissingNotGiven, "the port has no carrier"};
  return settings;
}

TFinding<std::string> PermanentAddressOf(TMachineFiles const& files, TLink const& link) {
  if (link.fPermanentAddress) return link.fPermanentAddress;
  return AskPermanentAddress(files, link.fName).Then(PermanentAddressIn);
}

// The PCI device among those above the port: above a virtio device there is one, for example. The controller of a USB bus is
// not that of its ports.
TFinding<std::string> PciAddressOf(TMachineFiles const& files, std::string const& port) {
  auto device = files.RealPath("/sys/class/net/" + port + "/device");
  if (!device) return device.Why();
  for (std::string path = *device; path.find('/', 1) != std::string::npos; path.erase(path.rfind('/'))) {
    auto const bus = files.RealName(path + "/subsystem");
    if (bus && *bus == "usb") break;
    if (bus && *bus == "pci") return path.substr(path.rfind('/') + 1);
  }
  return TMissing{kMissingNotApplicable, "the port is not a device of the PCI bus"};
}

TPort PortFrom(TMachineFiles const& files, TLink const& link) {
  return {link,
          files.Exists("/sys/class/net/" + link.fName + "/phy80211"),
          TDriverInfo(AskDriverInfo(files, link.fName)),
          SettingsOf(files, link),
          TWakeOnLan(AskWakeOnLan(files, link.fName)),
          PermanentAddressOf(files, link),
          PciAddressOf(files, link.fName)};
}

}  // namespace

bool TPort::IsEthernet() const { return fLink.fType && *fLink.fType == ARPHRD_ETHER && !fIsWireless; }

std::vector<TPort> PortsOf(TMachineFiles const& files, TLinks const& links) {
  std::vector<TPort> ports;
  for (TLink const& link : links.fAll)
    if (link.fParentDevice) ports.push_back(PortFrom(files, link));
  return ports;
}

}  // namespace NQRVZEP20
