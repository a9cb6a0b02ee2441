// SPDX-License-Identifier: Apache-2.0
#include "NetworkNamespace.h"

#include "Address.h"
#include "Associations.h"
#include "BondRecords.h"
#include "BridgeRecords.h"
#include "InterfaceRecords.h"
#include "PortRecords.h"
#include "Resolvers.h"
#include "Route.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/reasons/TRecordWriter.h"

#include <map>
#include <set>

namespace NQRVZEP20 {

namespace {

// Fills a namespace, subject by subject: each step uses the records of the earlier ones.
class TNetworkFill {
public:
  TNetworkFill(TMemoryNamespace& ns, TMachineFiles const& files)
      : fFiles(files), fWriter(ns), fSystem(files), fSystemRecord(fSystem.Record()), fLinks(LinksOf(files)) {}

  void Fill() {
    fWriter.Write(fSystemRecord);
    WriteInterfaces();
    WritePorts();
    WriteStatistics();
    WriteVlans();
    WriteBonds();
    WriteBridges();
    WriteAddresses();
    WriteRoutes();
    WriteResolvers();
    fWriter.WriteMissing();
  }

private:
  using TRecords = std::vector<TRecord>;

  // Why a class of interfaces has no instance.
  TMissing WhyNone(char const* reason) const {
    return fLinks.fAll.empty() && fLinks.fWhyNotAll ? *fLinks.fWhyNotAll : TMissing{kMissingNotApplicable, reason};
  }

  // Writes a class with more records than these, all of which are written at once.
  void WriteSome(TRecord const& shape, TRecords const& records, std::optional<TMissing> const& whyNotAll,
                 TMissing const& whyNone) {
    fWriter.Write(shape, records, whyNotAll ? *whyNotAll : whyNone);
    if (whyNotAll && !records.empty()) fWriter.AddMissing(shape.GetClassName(), "", *whyNotAll);
  }

  TRecord const& InterfaceNamed(std::string const& name) const { return fInterfaces.at(name); }

  void WriteInterfaces() {
    TRecords records;
    for (TLink const& link : fLinks.fAll) {
      records.push_back(InterfaceRecord(link, fLinks, fSystem));
      fInterfaces.emplace(link.fName, records.back());
    }
    WriteSome(InterfaceRecord(TLink(), fLinks, fSystem), records, fLinks.fWhyNotAll, WhyNone("the kernel lists no interface"));
    for (TRecord const& record : records) fWriter.Associate(kHostedAccessPoint, fSystemRecord, record);
  }

  // ---- Ports ----

  void WritePorts() {
    std::vector<TPort> const ports = PortsOf(fFiles, fLinks);
    std::vector<TPort> ethernet, other;
    for (TPort const& port : ports) (port.IsEthernet() ? ethernet : other).push_back(port);
    WritePortClass(other, EmptyPort(false),
                   ports.empty() ? "no network interface is a device of this machine"
                                 : "no port other than of Ethernet is a device of this machine");
    WritePortClass(ethernet, EmptyPort(true), "no Ethernet port is a device of this machine");
    for (TPort const& port : ports)
      fWriter.Associate(kSapOfDevice, fPorts.at(port.fLink.fName), InterfaceNamed(port.fLink.fName));
    WriteControllers(ports);
    WriteCapabilities(ethernet);
    WriteSoftware(ports);
  }

  void WritePortClass(std::vector<TPort> const& ports, TPort const& empty, char const* whyNone) {
    TRecords records;
    for (TPort const& port : ports) {
      records.push_back(PortRecord(port, fSystem, fLinks.fSource));
      fPorts.emplace(port.fLink.fName, records.back());
    }
    fWriter.Write(PortRecord(empty, fSystem, fLinks.fSource), records, WhyNone(whyNone));
    for (TRecord const& record : records) fWriter.Associate(kSystemDevice, fSystemRecord, record);
  }

  // A controller may have several ports.
  void WriteControllers(std::vector<TPort> const& ports) {
    std::map<std::string, TRecord> controllers;
    for (TPort const& port : ports)
      if (port.fPciAddress) controllers.emplace(*port.fPciAddress, PciDeviceRecord(*port.fPciAddress, fSystem));
    WriteSome(PciDeviceRecord("", fSystem), ValuesOf(controllers), {}, WhyNone("no port is a device of the PCI bus"));
    for (TPort const& port : ports)
      if (port.fPciAddress) fWriter.Associate(kControlledBy, controllers.at(*port.fPciAddress), fPorts.at(port.fLink.fName));
  }

  void WriteCapabilities(std::vector<TPort> const& ports) {
    TRecords records;
    for (TPort const& port : ports) records.push_back(CapabilitiesRecord(port));
    fWriter.Write(CapabilitiesRecord(EmptyPort(true)), records, WhyNone("no Ethernet port is a device of this machine"));
    for (std::size_t i = 0; i < ports.size(); ++i)
      fWriter.Associate(kCapabilitiesOf, fPorts.at(ports[i].fLink.fName), records[i]);
  }

  // Ports may share a driver, but not their firmware.
  void WriteSoftware(std::vector<TPort> const& ports) {
    std::map<std::string, TRecord> drivers, firmware;
    for (TPort const& port : ports) {
      if (port.fDriver.fDriver) drivers.emplace(*port.fDriver.fDriver, DriverRecord(port));
      firmware.emplace(port.fLink.fName, FirmwareRecord(port));
    }
    TRecords records = ValuesOf(drivers);
    for (TRecord const& record : ValuesOf(firmware)) records.push_back(record);
    fWriter.Write(FirmwareRecord(EmptyPort(true)), records, WhyNone("no port is a device of this machine"));
    for (TPort const& port : ports) {
      TRecord const& record = fPorts.at(port.fLink.fName);
      if (port.fDriver.fDriver) fWriter.Associate(kSoftwareOf, drivers.at(*port.fDriver.fDriver), record);
      fWriter.Associate(kSoftwareOf, firmware.at(port.fLink.fName), record);
    }
  }

  static TRecords ValuesOf(std::map<std::string, TRecord> const& records) {
    TRecords values;
    for (auto const& [name, record] : records) values.push_back(record);
    return values;
  }

  // The counters belong to the port, or otherwise to the interface.
  void WriteStatistics() {
    TRecords records;
    for (TLink const& link : fLinks.fAll) records.push_back(StatisticsRecord(link, fLinks.fSource));
    fWriter.Write(StatisticsRecord(TLink(), fLinks.fSource), records, WhyNone("the kernel lists no interface"));
    for (std::size_t i = 0; i < records.size(); ++i) {
      auto const port = fPorts.find(fLinks.fAll[i].fName);
      fWriter.Associate(kStatisticsOf, port != fPorts.end() ? port->second : InterfaceNamed(fLinks.fAll[i].fName), records[i]);
    }
  }

  // ---- Virtual interfaces ----

  void WriteVlans() {
    TRecords records;
    for (TLink const& link : fLinks.fAll)
      if (link.IsKind("vlan")) records.push_back(VlanRecord(link, fLinks, fSystem));
    fWriter.Write(VlanRecord(TLink(), fLinks, fSystem), records, WhyNone("no interface is one of a VLAN"));
    auto record = records.begin();
    for (TLink const& link : fLinks.fAll) {
      if (!link.IsKind("vlan")) continue;
      fWriter.Associate(kHostedAccessPoint, fSystemRecord, *record);
      fWriter.Associate(kBindsTo, *record, InterfaceNamed(link.fName));
      if (TLink const* const lower = fLinks.WithIndex(link.fLower))
        fWriter.Associate(kBindsTo, InterfaceNamed(lower->fName), *record);
      ++record;
    }
  }

  // Writes a record for each interface, and ties it to the system and to the interface.
  template <class TMakeRecord>
  std::map<std::string, TRecord> WriteMembers(bool (*isMaster)(TLink const&), TMakeRecord makeRecord, char const* whyNone) {
    std::map<std::string, TRecord> members;
    for (TLink const& master : fLinks.fAll)
      if (isMaster(master))
        for (TLink const* const member : MembersOf(master, fLinks)) members.emplace(member->fName, makeRecord(*member));
    fWriter.Write(makeRecord(TLink()), ValuesOf(members), WhyNone(whyNone));
    for (auto const& [name, record] : members) {
      fWriter.Associate(kHostedAccessPoint, fSystemRecord, record);
      fWriter.Associate(kBindsTo, InterfaceNamed(name), record);
    }
    return members;
  }

  template <class TMakeRecord>
  std::map<std::string, TRecord> WriteMasters(bool (*isMaster)(TLink const&), TMakeRecord makeRecord, char const* whyNone) {
    std::map<std::string, TRecord> masters;
    for (TLink const& link : fLinks.fAll)
      if (isMaster(link)) masters.emplace(link.fName, makeRecord(link));
    fWriter.Write(makeRecord(TLink()), ValuesOf(masters), WhyNone(whyNone));
    return masters;
  }

  void WriteBonds() {
    auto const bonds = WriteMasters(
        IsBond, [&](TLink const& bond) { return BondRecord(fFiles, bond, fLinks); }, "no interface is a bond");
    auto const members = WriteMembers(
        IsBond, [&](TLink const& member) { return BondMemberRecord(fFiles, member, fLinks, fSystem); },
        "no interface is a member of a bond");
    for (auto const& [name, record] : bonds) {
      fWriter.Associate(kHostedCollection, fSystemRecord, record);
      fWriter.Associate(kSameAs, record, InterfaceNamed(name));
    }
    ForEachMember(bonds, members,
                  [&](TRecord const& bond, TRecord const& member) { fWriter.Associate(kMemberOf, bond, member); });
  }

  void WriteBridges() {
    auto const bridges = WriteMasters(
        IsBridge, [&](TLink const& bridge) { return BridgeRecord(fFiles, bridge, fLinks, fSystem); }, "no interface is a bridge");
    auto const ports = WriteMembers(
        IsBridge, [&](TLink const& port) { return BridgePortRecord(fFiles, port, fLinks, fSystem); },
        "no interface is a port of a bridge");
    for (auto const& [name, record] : bridges) {
      fWriter.Associate(kHostedService, fSystemRecord, record);
      fWriter.Associate(kProvidesEndpoint, record, InterfaceNamed(name));
    }
    ForEachMember(bridges, ports,
                  [&](TRecord const& bridge, TRecord const& port) { fWriter.Associate(kSwitchesAmong, port, bridge); });
  }

  template <class TVisit>
  void ForEachMember(std::map<std::string, TRecord> const& masters, std::map<std::string, TRecord> const& members,
                     TVisit const& visit) const {
    for (TLink const& link : fLinks.fAll) {
      TLink const* const master = fLinks.WithIndex(link.fMaster);
      if (master == nullptr) continue;
      auto const of = masters.find(master->fName), member = members.find(link.fName);
      if (of != masters.end() && member != members.end()) visit(of->second, member->second);
    }
  }

  // ---- IP ----

  void WriteAddresses() {
    TAddresses const addresses = AddressesOf(fFiles, fLinks);
    TRecords records;
    for (TAddress const& address : addresses.fAll) records.push_back(AddressRecord(address, fSystem));
    WriteSome(AddressRecord(TAddress(), fSystem), records, addresses.fWhyNotAll, {});
    for (std::size_t i = 0; i < records.size(); ++i) {
      fWriter.Associate(kHostedAccessPoint, fSystemRecord, records[i]);
      fWriter.Associate(kBindsTo, InterfaceNamed(addresses.fAll[i].fInterface), records[i]);
    }
  }

  void WriteRoutes() {
    fRoutes = RoutesOf(fFiles, fLinks);
    for (TRoute const& route : fRoutes.fAll) fRouteRecords.push_back(RouteRecord(route));
    WriteSome(RouteRecord(TRoute()), fRouteRecords, fRoutes.fWhyNotAll, {});
    for (std::size_t i = 0; i < fRouteRecords.size(); ++i) {
      fWriter.Associate(kHostedRoute, fSystemRecord, fRouteRecords[i]);
      if (fRoutes.fAll[i].fInterface)
        fWriter.Associate(kRouteUses, InterfaceNamed(*fRoutes.fAll[i].fInterface), fRouteRecords[i]);
    }
  }

  void WriteResolvers() {
    auto const resolvers = ResolversOf(fFiles);
    TRecords records;
    std::map<std::string, TRecord> gateways;
    for (TRemoteHost const& gateway : GatewaysOf(fRoutes)) {
      records.push_back(RemoteHostRecord(gateway, "rtnetlink, resolv.conf", fSystem));
      gateways.emplace(gateway.fAddress, records.back());
    }
    if (resolvers)
      for (std::string const& server : resolvers->fServers)
        records.push_back(RemoteHostRecord({server, TRemoteHost::kResolver}, "rtnetlink, resolv.conf", fSystem));
    fWriter.Write(RemoteHostRecord({"", TRemoteHost::kResolver}, "rtnetlink, resolv.conf", fSystem), records,
                  resolvers ? TMissing{kMissingNotGiven, "no route has a gateway, and " + resolvers->fFile + " names no server"}
                            : resolvers.Why());
    for (TRecord const& record : records) fWriter.Associate(kRemoteAccess, record, fSystemRecord);
    for (std::size_t i = 0; i < fRouteRecords.size(); ++i)
      if (fRoutes.fAll[i].fGateway) fWriter.Associate(kNextHop, gateways.at(*fRoutes.fAll[i].fGateway), fRouteRecords[i]);
    WriteDns(resolvers);
  }

  void WriteDns(TFinding<TResolvers> const& resolvers) {
    TRecords records;
    if (resolvers) records.push_back(DnsRecord(*resolvers));
    fWriter.Write(DnsRecord(TResolvers{"/etc/resolv.conf"}), records, resolvers ? TMissing() : resolvers.Why());
    for (TRecord const& record : records) fWriter.Associate(kSettingOf, fSystemRecord, record);
  }

  TMachineFiles const& fFiles;
  TRecordWriter fWriter;
  TComputerSystem const fSystem;
  TRecord const fSystemRecord;
  TLinks const fLinks;
  std::map<std::string, TRecord> fInterfaces, fPorts;  // by name
  TRoutes fRoutes;
  TRecords fRouteRecords;  // one for each of fRoutes
};

}  // namespace

void FillNetworkNamespace(TMemoryNamespace& ns, TMachineFiles const& files) { TNetworkFill(ns, files).Fill(); }

}  // namespace NQRVZEP20
