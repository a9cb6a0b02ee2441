// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "LinkModes.h"
#include "providers/reasons/TFinding.h"
#include "providers/reasons/TMachineFiles.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The answers of a port's driver to the ioctl SIOCETHTOOL, parsed from the bytes of the kernel's structures. Each value is
// missing if its answer is, or if the driver does not report it.

struct TDriverInfo {
  explicit TDriverInfo(TFinding<std::string> const& answer);  // to ETHTOOL_GDRVINFO

  TFinding<std::string> fDriver, fVersion, fFirmware;
};

struct TLinkSettings {
  explicit TLinkSettings(TFinding<std::string> const& answer);  // to ETHTOOL_GLINKSETTINGS

  TFinding<std::uint64_t> fSpeed;  // bits per second
  TFinding<bool> fIsFullDuplex;
  TFinding<bool> fIsAutonegotiating;
  TFinding<std::string> fConnector;  // "Twisted Pair", …
  TFinding<std::vector<TLinkMode>> fSupported, fAdvertised, fOfPartner;
  TFinding<std::vector<std::string>> fSupportedFeatures, fAdvertisedFeatures;  // "Autoneg", "TP", "Pause", …
};

struct TWakeOnLan {
  explicit TWakeOnLan(TFinding<std::string> const& answer);  // to ETHTOOL_GWOL

  TFinding<bool> fIsSupported, fIsEnabled;
};

// The address in an answer to ETHTOOL_GPERMADDR, as AddressText returns it.
TFinding<std::string> PermanentAddressIn(std::string const& answer);

// The answers, from the driver or from the recorded files "ethtool/<port>/drvinfo", "…/linksettings", "…/permaddr", "…/wol".
TFinding<std::string> AskDriverInfo(TMachineFiles const& files, std::string const& port);
TFinding<std::string> AskLinkSettings(TMachineFiles const& files, std::string const& port);
TFinding<std::string> AskPermanentAddress(TMachineFiles const& files, std::string const& port);
TFinding<std::string> AskWakeOnLan(TMachineFiles const& files, std::string const& port);

}  // namespace NQRVZEP20
