// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/SecretProperties.h"

#include "collect/redaction/Texts.h"

#include <algorithm>
#include <iterator>
#include <unordered_map>

namespace NQRVZEP20 {

namespace {

struct TSecretProperty {
  std::string_view fClass;  // also of its subclasses; empty for every class
  std::string_view fProperty;
  EMeaning fMeaning;
};

constexpr TSecretProperty kProperties[] = {
    {"", "SerialNumber", EMeaning::kSerial},
    {"", "SerialNumbers", EMeaning::kSerial},
    {"", "ServiceTag", EMeaning::kSerial},
    {"", "IdentifyingNumber", EMeaning::kSerial},
    {"", "AssetTag", EMeaning::kSerial},
    {"", "UserTracking", EMeaning::kSerial},
    {"", "UUID", EMeaning::kSerial},
    {"", "GUID", EMeaning::kSerial},
    {"", "ContentUUID", EMeaning::kSerial},
    {"", "TableUUID", EMeaning::kSerial},
    {"", "EntryUUID", EMeaning::kSerial},
    {"", "MachineID", EMeaning::kSerial},
    {"", "WWN", EMeaning::kSerial},
    {"", "DeviceWWN", EMeaning::kSerial},
    {"", "PortWWN", EMeaning::kSerial},
    {"", "NodeWWN", EMeaning::kSerial},
    {"", "NodeName", EMeaning::kSerial},
    {"CIM_DiskPartition", "Signature", EMeaning::kSerial},
    {"CIM_GPTDiskPartition", "Signature", EMeaning::kSerial},

    {"CIM_System", "Name", EMeaning::kHost},
    {"CIM_ComputerSystem", "Name", EMeaning::kHost},
    {"QRVSG_ComputerSystem", "Name", EMeaning::kHost},
    {"", "SystemName", EMeaning::kHost},
    {"", "CSName", EMeaning::kHost},
    {"", "HostName", EMeaning::kHost},
    {"", "Hostname", EMeaning::kHost},
    {"", "DNSHostName", EMeaning::kHost},
    {"", "RequestedHostname", EMeaning::kHost},
    {"", "DomainName", EMeaning::kDomain},
    {"", "SearchDomains", EMeaning::kDomain},
    {"", "DNSSuffixesToRegister", EMeaning::kDomain},
    {"", "DNSSuffixesToAppend", EMeaning::kDomain},
    {"CIM_RemoteServiceAccessPoint", "AccessInfo", EMeaning::kUrl},

    {"", "MACAddress", EMeaning::kAddress},
    {"", "PermanentAddress", EMeaning::kAddress},
    {"", "NetworkAddresses", EMeaning::kAddress},
    {"", "AliasAddresses", EMeaning::kAddress},
    {"", "GroupAddresses", EMeaning::kAddress},
    {"", "ClientIdentifier", EMeaning::kAddress},
    {"", "PartnerMACAddress", EMeaning::kAddress},
    {"", "BridgeAddress", EMeaning::kAddress},
    {"", "DesignatedBridge", EMeaning::kAddress},
    {"", "DesignatedRoot", EMeaning::kAddress},
    {"", "IPAddress", EMeaning::kAddress},
    {"", "IPv4Address", EMeaning::kAddress},
    {"", "IPv6Address", EMeaning::kAddress},
    {"", "PeerAddress", EMeaning::kAddress},
    {"", "BroadcastAddress", EMeaning::kAddress},
    {"", "Gateway", EMeaning::kAddress},
    {"", "DefaultGateway", EMeaning::kAddress},
    {"", "PreferredSource", EMeaning::kAddress},
    {"", "DestinationAddress", EMeaning::kAddress},
    {"", "IPDestinationAddress", EMeaning::kAddress},
    {"", "DNSServerAddresses", EMeaning::kAddress},
    {"", "ARPTargets", EMeaning::kAddress},

    {"", "UserID", EMeaning::kUser},
    {"", "UserName", EMeaning::kUser},
    {"", "PrimaryOwnerName", EMeaning::kUser},
    {"", "PrimaryOwnerContact", EMeaning::kUser},
    {"", "GivenName", EMeaning::kUser},
    {"", "Surname", EMeaning::kUser},
    {"", "Mail", EMeaning::kUser},
    {"", "TelephoneNumber", EMeaning::kUser},
    {"CIM_UserEntity", "Name", EMeaning::kUser},
    {"CIM_UserContact", "Name", EMeaning::kUser},
    {"CIM_Person", "Name", EMeaning::kUser},
    {"CIM_Account", "Name", EMeaning::kUser},
    {"ZEP_ControllerAccount", "Name", EMeaning::kUser},

    {"CIM_RemoteFileSystem", "Name", EMeaning::kSource},
    {"ZEP_Mount", "Source", EMeaning::kSource},
    {"ZEP_Mount", "Options", EMeaning::kOptions},
    {"ZEP_Mount", "FileSystemOptions", EMeaning::kOptions},
    {"", "KernelCommandLine", EMeaning::kCommandLine},
};

constexpr std::string_view kFreeTexts[] = {
    "Address", "NextHop",     "Message", "RecordData", "Text",    "KernelCommandLine", "Alias",
    "Caption", "Description", "Reason",  "Source",     "Options", "FileSystemOptions", "OtherSettings"};

constexpr std::string_view kUsualTexts[] = {"not specified",
                                            "not available",
                                            "not applicable",
                                            "not present",
                                            "not provided",
                                            "unknown",
                                            "none",
                                            "n/a",
                                            "invalid",
                                            "empty",
                                            "default string",
                                            "default",
                                            "system serial number",
                                            "base board serial number",
                                            "chassis serial number",
                                            "serial number",
                                            "asset tag",
                                            "no asset tag",
                                            "no asset information",
                                            "to be filled by o.e.m.",
                                            "to be filled by oem",
                                            "o.e.m.",
                                            "oem",
                                            "(none)",
                                            "0123456789",
                                            "123456789",
                                            "1234567890",
                                            "null",
                                            "localhost",
                                            "localhost.localdomain",
                                            "localdomain",
                                            "false",
                                            "true"};

constexpr std::string_view kUsualUsers[] = {"root",  "admin",  "administrator", "user", "operator", "anonymous",
                                            "guest", "nobody", "daemon",        "usb",  "cdrom",    "disk"};  // below /media

// These addresses are the same everywhere: loopback, unspecified, broadcast, netmasks.
constexpr std::string_view kUsualAddresses[] = {"::1",       "::",        "fe80::",    "ff02::1",        "0.0.0.0",
                                                "127.0.0.1", "127.0.0.0", "127.0.1.1", "127.255.255.255"};

template <class TList>
bool Has(TList const& list, std::string_view text) {
  return std::find(std::begin(list), std::end(list), text) != std::end(list);
}

// Names of classes and properties are the same in upper and lower case.
bool IsSameName(std::string_view a, std::string_view b) {
  return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) { return Lower(x) == Lower(y); });
}

struct TNameHash {
  std::size_t operator()(std::string_view name) const {
    std::size_t hash = 0;
    for (char const byte : name) hash = hash * 31 + static_cast<unsigned char>(Lower(byte));
    return hash;
  }
};

struct TNameEqual {
  bool operator()(std::string_view a, std::string_view b) const { return IsSameName(a, b); }
};

using TRows = std::unordered_multimap<std::string_view, TSecretProperty const*, TNameHash, TNameEqual>;

// The rows for each property.
TRows const& RowsByProperty() {
  static auto const rows = [] {
    TRows map;
    for (TSecretProperty const& row : kProperties) map.emplace(row.fProperty, &row);
    return map;
  }();
  return rows;
}

bool IsOf(TSecretProperty const& row, std::vector<std::string> const& classes) {
  return row.fClass.empty() ||
         std::any_of(classes.begin(), classes.end(), [&](std::string const& each) { return IsSameName(each, row.fClass); });
}

// "0000:00:1f.2", which the kernel uses as the serial number of USB hubs.
bool IsPciAddress(std::string_view text) {
  return text.size() == 12 && text[4] == ':' && text[7] == ':' && text[10] == '.' && IsHex(Compact(text));
}

bool IsOneCharacter(std::string_view text) {
  std::string const letters = Compact(text);
  return letters.find_first_not_of(letters.empty() ? ' ' : letters.front()) == letters.npos;
}

}  // namespace

std::optional<EMeaning> MeaningOfProperty(std::vector<std::string> const& classes, std::string_view property) {
  auto const [first, last] = RowsByProperty().equal_range(property);
  auto const row = std::find_if(first, last, [&](auto const& each) { return IsOf(*each.second, classes); });
  return row == last ? std::nullopt : std::optional(row->second->fMeaning);
}

std::optional<EMeaning> MeaningOfRow(std::string_view key) {
  if (key == "hostName") return EMeaning::kHost;
  if (key == "serialNumber" || key == "uuid") return EMeaning::kSerial;
  return std::nullopt;
}

ESecretKind KindOf(EMeaning meaning) {
  switch (meaning) {
    case EMeaning::kSerial:
      return ESecretKind::kSerials;
    case EMeaning::kAddress:
      return ESecretKind::kAddresses;
    case EMeaning::kUser:
    case EMeaning::kPassword:
      return ESecretKind::kUsers;
    default:
      return ESecretKind::kHosts;
  }
}

bool DescribesSerial(std::string_view description) {
  std::string const text = Lower(description);
  for (char const* word : {"serial", "asset", "uuid", "guid", "wwn", "world wide", "naa", "eui", "nvme"})
    if (text.find(word) != text.npos) return true;
  return false;
}

bool IsFreeText(std::string_view property) {
  return std::any_of(std::begin(kFreeTexts), std::end(kFreeTexts),
                     [&](std::string_view each) { return IsSameName(each, property); });
}

bool IsPlaceholder(ESecretKind kind, std::string_view value) {
  constexpr std::size_t shortest = 3;
  std::string const text = Lower(value);
  if (Compact(text).size() < shortest || IsOneCharacter(text) || Has(kUsualTexts, text)) return true;
  if (kind == ESecretKind::kUsers) return Has(kUsualUsers, text);
  if (kind == ESecretKind::kSerials) return IsPciAddress(text);
  if (kind == ESecretKind::kHosts) return false;
  bool const isMulticast = text.rfind("ff", 0) == 0 && IsIPv6(text);
  return text.rfind("255.", 0) == 0 || isMulticast || Has(kUsualAddresses, text);
}

}  // namespace NQRVZEP20
