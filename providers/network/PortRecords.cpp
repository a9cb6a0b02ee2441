// SPDX-License-Identifier: Apache-2.0
#include "PortRecords.h"

#include "LinkState.h"

#include <linux/if_arp.h>

#include <algorithm>
#include <set>

namespace NQRVZEP20 {

namespace {

using TTexts = TFinding<std::vector<std::string>>;

constexpr TValueName kPortTypes[] = {
    {"50", "10BaseT"},      {"52", "100BaseT"},     {"53", "1000BaseT"},     {"54", "2500BaseT"},    {"55", "10GBaseT"},
    {"57", "1000Base-KX"},  {"58", "10GBase-KX4"},  {"59", "10GBase-KR"},    {"100", "100Base-FX"},  {"105", "10GBase-SR"},
    {"108", "10GBase-LR"},  {"110", "10GBase-ER"},  {"112", "10GBase-LRM"},  {"200", "40GBase-KR4"}, {"201", "40GBase-CR4"},
    {"202", "40GBase-SR4"}, {"204", "40GBase-LR4"}, {"304", "100GBase-KR4"}, {"305", "100GBase-CR4"}};
constexpr TValueName kTechnologies[] = {{"1", "Other"}, {"2", "Ethernet"}, {"3", "IB"}, {"4", "FC"}, {"11", "Wireless LAN"}};
constexpr std::uint16_t kOther = 1, kEthernet = 2, kInfiniBand = 3, kFibreChannel = 4, kWireless = 11;
constexpr TValueName kCapabilities[] = {{"3", "WakeOnLan"}};
constexpr std::uint16_t kWakeOnLan = 3;
constexpr TValueName kClassifications[] = {{"2", "Driver"}, {"10", "Firmware"}};
constexpr std::uint16_t kDriver = 2, kFirmware = 10;

TFinding<std::uint16_t> TechnologyOf(TPort const& port) {
  return port.fLink.fType.Then([&](std::uint16_t type) {
    if (port.fIsWireless) return kWireless;
    if (type == ARPHRD_ETHER) return kEthernet;
    if (type == ARPHRD_INFINIBAND) return kInfiniBand;
    return type >= ARPHRD_FCPP && type <= ARPHRD_FCFABRIC ? kFibreChannel : kOther;
  });
}

// The type of the only supported mode with the current speed: a port of 1 Gbit/s may support 1000BaseT and 1000Base-KX.
TFinding<std::uint16_t> PortTypeOf(TLinkSettings const& settings) {
  if (!settings.fSpeed) return settings.fSpeed.Why();
  if (!settings.fSupported) return settings.fSupported.Why();
  std::set<std::uint16_t> types;
  for (TLinkMode const& mode : *settings.fSupported)
    if (mode.fSpeed == *settings.fSpeed) types.insert(PortTypeOf(mode));
  if (types.size() == 1 && *types.begin() != 0) return *types.begin();
  if (types.empty()) return TMissing{kMissingNotGiven, "the driver lists no link mode with the current speed"};
  return TMissing{kMissingNotGiven, "the link modes with the current speed have no or several types in the schema"};
}

TFinding<std::uint64_t> MaxSpeedOf(TLinkSettings const& settings) {
  return settings.fSupported.Then([](std::vector<TLinkMode> const& modes) {
    std::uint64_t speed = 0;
    for (TLinkMode const& mode : modes) speed = std::max(speed, mode.fSpeed);
    return speed;
  });
}

TFinding<std::uint64_t> MaxMtuOf(TLink const& link) {
  return link.fMaxMtu.Then([](std::uint32_t mtu) -> TFinding<std::uint64_t> {
    if (mtu == 0) return TMissing{kMissingNotGiven, "the driver sets no upper limit"};
    return std::uint64_t(mtu);
  });
}

TFinding<std::vector<std::uint16_t>> WakeOnLanIf(TFinding<bool> const& isTrue) {
  return isTrue.Then([](bool has) { return has ? std::vector<std::uint16_t>{kWakeOnLan} : std::vector<std::uint16_t>(); });
}

// Further names of the port, and for each its kind.
struct TIdentity {
  std::vector<std::string> fInfos, fDescriptions;

  void Add(std::string info, std::string description) {
    fInfos.push_back(std::move(info));
    fDescriptions.push_back(std::move(description));
  }
};

TIdentity IdentityOf(TLink const& link) {
  TIdentity identity;
  if (link.fParentDevice) identity.Add(*link.fParentDevice, link.fParentBus ? *link.fParentBus + " device" : "device");
  if (link.fPhysicalPort) identity.Add(*link.fPhysicalPort, "physical port");
  for (std::string const& name : link.fOtherNames) identity.Add(name, "alternative name");
  return identity;
}

TTexts NamesOf(TFinding<std::vector<TLinkMode>> const& modes) {
  return modes.Then([](std::vector<TLinkMode> const& all) {
    std::vector<std::string> names;
    for (TLinkMode const& mode : all) names.push_back(mode.fName);
    return names;
  });
}

TFinding<std::vector<std::uint64_t>> SpeedsOf(TFinding<std::vector<TLinkMode>> const& modes) {
  return modes.Then([](std::vector<TLinkMode> const& all) {
    std::set<std::uint64_t> speeds;
    for (TLinkMode const& mode : all) speeds.insert(mode.fSpeed);
    return std::vector<std::uint64_t>(speeds.begin(), speeds.end());
  });
}

void AddOfEthernet(TRecord& record, TPort const& port) {
  record.Add("PortType", PortTypeOf(port.fSettings)).Names(kPortTypes);
  record.Add("Capabilities", WakeOnLanIf(port.fWakeOnLan.fIsSupported)).Names(kCapabilities);
  record.Add("EnabledCapabilities", WakeOnLanIf(port.fWakeOnLan.fIsEnabled)).Names(kCapabilities);
}

TRecord SoftwareRecord(std::string const& id, std::string const& name, std::uint16_t classification,
                       TFinding<std::string> const& version) {
  TRecord record("CIM_SoftwareIdentity", "ethtool");
  record.AddKey("InstanceID", id);
  record.AddOwn("ElementName", name);
  record.Add("Classifications", TFinding<std::vector<std::uint16_t>>({classification})).Names(kClassifications);
  record.Add("VersionString", version);
  return record;
}

}  // namespace

TRecord PortRecord(TPort const& port, TComputerSystem const& system, std::string const& linkSource) {
  TLink const& link = port.fLink;
  TIdentity const identity = IdentityOf(link);
  TRecord record(port.IsEthernet() ? "CIM_EthernetPort" : "CIM_NetworkPort", linkSource);
  system.AddDeviceKeys(record, link.fName);
  record.Add("ElementName", TFinding<std::string>(link.fName));
  AddState(record, link);
  record.Add("LinkTechnology", TechnologyOf(port)).Names(kTechnologies);
  record.Add("NetworkAddresses",
             link.fAddress.Then([](std::string const& address) { return std::vector<std::string>{address}; }));
  record.Add("PermanentAddress", port.fPermanentAddress);
  record.Add("ActiveMaximumTransmissionUnit", link.fMtu.Then([](std::uint32_t mtu) { return std::uint64_t(mtu); })).Unit("byte");
  record.Add("SupportedMaximumTransmissionUnit", MaxMtuOf(link)).Unit("byte");
  record.Add("OtherIdentifyingInfo", TTexts(identity.fInfos));
  record.Add("IdentifyingDescriptions", TTexts(identity.fDescriptions));

  record.SetSource("ethtool, sysfs");
  record.Add("Speed", port.fSettings.fSpeed).Unit("bit / second");
  record.Add("FullDuplex", port.fSettings.fIsFullDuplex);

  record.SetSource("ethtool");
  record.Add("MaxSpeed", MaxSpeedOf(port.fSettings)).Unit("bit / second");
  record.Add("AutoSense", port.fSettings.fIsAutonegotiating);
  if (port.IsEthernet()) AddOfEthernet(record, port);
  return record;
}

TRecord CapabilitiesRecord(TPort const& port) {
  TRecord record("ZEP_EthernetPortCapabilities", "ethtool", "CIM_NetworkPortCapabilities");
  record.AddKey("InstanceID", port.fLink.fName + " capabilities");
  record.AddOwn("ElementName", port.fLink.fName);
  record.Add("PortSpeedsSupported", SpeedsOf(port.fSettings.fSupported)).Unit("bit / second");
  record.Add("SupportedLinkModes", NamesOf(port.fSettings.fSupported));
  record.Add("AdvertisedLinkModes", NamesOf(port.fSettings.fAdvertised));
  record.Add("PartnerLinkModes", NamesOf(port.fSettings.fOfPartner));
  record.Add("SupportedFeatures", port.fSettings.fSupportedFeatures);
  record.Add("AdvertisedFeatures", port.fSettings.fAdvertisedFeatures);
  record.Add("Connector", port.fSettings.fConnector);
  return record;
}

TRecord DriverRecord(TPort const& port) {
  std::string const driver = port.fDriver.fDriver ? *port.fDriver.fDriver : "";
  return SoftwareRecord("driver " + driver, driver, kDriver, port.fDriver.fVersion);
}

TRecord FirmwareRecord(TPort const& port) {
  return SoftwareRecord("firmware of " + port.fLink.fName, port.fLink.fName + " firmware", kFirmware, port.fDriver.fFirmware);
}

TRecord PciDeviceRecord(std::string const& address, TComputerSystem const& system) {
  TRecord record("CIM_PCIDevice", "sysfs");
  system.AddDeviceKeys(record, address);
  return record;
}

TPort EmptyPort(bool isEthernet) {
  TMissing const none;
  TLink link;
  if (isEthernet) link.fType = std::uint16_t(ARPHRD_ETHER);
  return {link, false, TDriverInfo(none), TLinkSettings(none), TWakeOnLan(none), none, none};
}

}  // namespace NQRVZEP20
