// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as each answer that the network provider parses: the dumps of rtnetlink, the structures of ethtool and
// resolv.conf. Each property of each record must have a value or a reason, and no two instances the same name.

#include "fuzz/Require.h"
#include "providers/network/Address.h"
#include "providers/network/InterfaceRecords.h"
#include "providers/network/PortRecords.h"
#include "providers/network/Resolvers.h"
#include "providers/network/Route.h"

#include <set>

namespace NQRVZEP20 {

namespace {

class TNames {
public:
  void Add(std::string const& name) { Require(fNames.insert(name).second); }

private:
  std::set<std::string> fNames;
};

void RequireWhole(TRecord const& record) {
  for (TRecordProperty const& property : record.GetProperties())
    Require(!property.fValue.IsNull() || (!property.fMissing.fCode.empty() && !property.fMissing.fReason.empty()));
}

TComputerSystem const& System() {
  static TComputerSystem const system(TMachineFiles("/nonexistent"));
  return system;
}

TLinks OneLink() {
  TLink link;
  link.fName = "eth0";
  link.fIndex = 2u;
  return {"fuzz", {link}, {}};
}

void ReadAsLinks(std::string const& bytes) {
  TLinks const links = LinksIn(bytes);
  TNames names;
  for (TLink const& link : links.fAll) {
    names.Add(link.fName);
    RequireWhole(InterfaceRecord(link, links, System()));
    RequireWhole(StatisticsRecord(link, ""));
    RequireWhole(VlanRecord(link, links, System()));
  }
}

void ReadAsAddressesAndRoutes(std::string const& bytes) {
  TLinks const links = OneLink();
  TNames addresses, routes;
  for (TAddress const& address : AddressesIn(bytes, links).fAll) {
    addresses.Add(address.Name());
    RequireWhole(AddressRecord(address, System()));
  }
  TRoutes const found = RoutesIn(bytes, links);
  for (TRoute const& route : found.fAll) {
    routes.Add(route.Name());
    RequireWhole(RouteRecord(route));
  }
  for (TRemoteHost const& gateway : GatewaysOf(found)) RequireWhole(RemoteHostRecord(gateway, "", System()));
}

void ReadAsAnswersOfTheDriver(std::string const& bytes) {
  TPort port = EmptyPort(true);
  port.fLink.fName = "eth0";
  port.fDriver = TDriverInfo(bytes);
  port.fSettings = TLinkSettings(bytes);
  port.fWakeOnLan = TWakeOnLan(bytes);
  port.fPermanentAddress = PermanentAddressIn(bytes);
  port.fLink.fFlags = 0u;
  static_cast<void>(PortRecord(port, System(), ""));
  RequireWhole(CapabilitiesRecord(port));
  RequireWhole(DriverRecord(port));
  RequireWhole(FirmwareRecord(port));
}

}  // namespace

}  // namespace NQRVZEP20

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const bytes(reinterpret_cast<char const*>(data), size);
  NQRVZEP20::ReadAsLinks(bytes);
  NQRVZEP20::ReadAsAddressesAndRoutes(bytes);
  NQRVZEP20::ReadAsAnswersOfTheDriver(bytes);
  NQRVZEP20::RequireWhole(NQRVZEP20::DnsRecord(NQRVZEP20::ResolversIn(bytes)));
  return 0;
}
