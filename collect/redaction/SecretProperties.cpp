// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/SecretProperties.h"

#include "collect/redaction/Texts.h"

#include <algorithm>
#include <iterator>
#include <unordered_map>

namespace NQRVZEP20 {

namespace {

using EKind = ESecretKind;

struct TSecretProperty {
  std::string_view fClass;  // also of its subclasses; empty for every class
  std::string_view fProperty;
  EKind fKind;
};

constexpr TSecretProperty kProperties[] = {
    {"", "SerialNumber", EKind::kSerials},
    {"", "IdentifyingNumber", EKind::kSerials},
    {"", "AssetTag", EKind::kSerials},
    {"", "UserTracking", EKind::kSerials},
    {"", "UUID", EKind::kSerials},
    {"", "GUID", EKind::kSerials},
    {"", "ContentUUID", EKind::kSerials},
    {"", "TableUUID", EKind::kSerials},
    {"", "EntryUUID", EKind::kSerials},
    {"", "MachineID", EKind::kSerials},
    {"", "WWN", EKind::kSerials},
    {"", "DeviceWWN", EKind::kSerials},
    {"", "PortWWN", EKind::kSerials},
    {"", "NodeWWN", EKind::kSerials},
    {"CIM_DiskPartition", "Signature", EKind::kSerials},
    {"CIM_GPTDiskPartition", "Signature", EKind::kSerials},

    {"CIM_System", "Name", EKind::kHosts},
    {"CIM_ComputerSystem", "Name", EKind::kHosts},
    {"QRVSG_ComputerSystem", "Name", EKind::kHosts},
    {"", "SystemName", EKind::kHosts},
    {"", "CSName", EKind::kHosts},
    {"", "HostName", EKind::kHosts},
    {"", "Hostname", EKind::kHosts},
    {"", "DNSHostName", EKind::kHosts},
    {"", "DomainName", EKind::kHosts},
    {"", "SearchDomains", EKind::kHosts},
    {"", "DNSSuffixesToRegister", EKind::kHosts},

    {"", "MACAddress", EKind::kAddresses},
    {"", "PermanentAddress", EKind::kAddresses},
    {"", "NetworkAddresses", EKind::kAddresses},
    {"", "PartnerMACAddress", EKind::kAddresses},
    {"", "BridgeAddress", EKind::kAddresses},
    {"", "DesignatedBridge", EKind::kAddresses},
    {"", "DesignatedRoot", EKind::kAddresses},
    {"", "IPAddress", EKind::kAddresses},
    {"", "IPv4Address", EKind::kAddresses},
    {"", "IPv6Address", EKind::kAddresses},
    {"", "PeerAddress", EKind::kAddresses},
    {"", "BroadcastAddress", EKind::kAddresses},
    {"", "Gateway", EKind::kAddresses},
    {"", "DefaultGateway", EKind::kAddresses},
    {"", "PreferredSource", EKind::kAddresses},
    {"", "DestinationAddress", EKind::kAddresses},
    {"", "DNSServerAddresses", EKind::kAddresses},
    {"", "ARPTargets", EKind::kAddresses},
    {"CIM_RemoteServiceAccessPoint", "AccessInfo", EKind::kAddresses},

    {"", "UserID", EKind::kUsers},
    {"", "UserName", EKind::kUsers},
    {"", "PrimaryOwnerName", EKind::kUsers},
    {"", "PrimaryOwnerContact", EKind::kUsers},
    {"CIM_Account", "Name", EKind::kUsers},
    {"ZEP_ControllerAccount", "Name", EKind::kUsers},
};

constexpr std::string_view kFreeTexts[] = {
    "Message", "RecordData", "Text",    "KernelCommandLine", "Alias",        "Caption", "Description",
    "Reason",  "Source",     "Options", "FileSystemOptions", "OtherSettings"};

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

constexpr std::string_view kUsualUsers[] = {"root",      "admin", "administrator", "user",  "operator",
                                            "anonymous", "guest", "nobody",        "daemon"};

// These addresses are the same everywhere: loopback, unspecified, broadcast, netmasks.
constexpr std::string_view kUsualAddresses[] = {"::1",       "::",        "fe80::",    "ff02::1",        "0.0.0.0",
                                                "127.0.0.1", "127.0.0.0", "127.0.1.1", "127.255.255.255"};

template <class TList>
bool Has(TList const& list, std::string_view text) {
  return std::find(std::begin(list), std::end(list), text) != std::end(list);
}

// The rows for each property.
std::unordered_multimap<std::string_view, TSecretProperty const*> const& RowsByProperty() {
  static auto const rows = [] {
    std::unordered_multimap<std::string_view, TSecretProperty const*> map;
    for (TSecretProperty const& row : kProperties) map.emplace(row.fProperty, &row);
    return map;
  }();
  return rows;
}

bool IsOf(TSecretProperty const& row, std::vector<std::string> const& classes) {
  return row.fClass.empty() || Has(classes, row.fClass);
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

std::optional<ESecretKind> KindOfProperty(std::vector<std::string> const& classes, std::string_view property) {
  auto const [first, last] = RowsByProperty().equal_range(property);
  auto const row = std::find_if(first, last, [&](auto const& each) { return IsOf(*each.second, classes); });
  return row == last ? std::nullopt : std::optional(row->second->fKind);
}

std::optional<ESecretKind> KindOfRow(std::string_view key) {
  if (key == "hostName") return ESecretKind::kHosts;
  if (key == "serialNumber" || key == "uuid") return ESecretKind::kSerials;
  return std::nullopt;
}

bool DescribesSerial(std::string_view description) {
  std::string const text = Lower(description);
  for (char const* word : {"serial", "asset", "uuid", "guid", "wwn", "world wide", "naa", "eui", "nvme"})
    if (text.find(word) != text.npos) return true;
  return false;
}

bool IsFreeText(std::string_view property) { return Has(kFreeTexts, property); }

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
