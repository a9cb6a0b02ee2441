// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TController.h"

namespace NQRVZEP20 {

// The parts of ReadController, one or more commands each.

// "12345678-9abc-..." of the 16 bytes, which are in reverse order.
TFinding<std::string> GuidFrom(std::string const& bytes);

// The channels that are LANs. Missing if the controller answers no query about its channels.
TFinding<std::vector<TLanChannel>> ReadLanChannels(TIpmi const& ipmi);

// The accounts that have a name or are enabled, for the first LAN channel. Missing if the controller does not describe the first
// account, because its answer has the number of accounts. Never their passwords: no command reads them.
TFinding<std::vector<TUserAccount>> ReadUsers(TIpmi const& ipmi, TFinding<std::vector<TLanChannel>> const& lans);

TSensorState ReadSensor(TIpmi const& ipmi, TSdrSensor const& sensor);

// The areas of a FRU device, of which at most 64 KiB are read.
TFinding<std::vector<TFruArea>> ReadFru(TIpmi const& ipmi, std::uint8_t device);

}  // namespace NQRVZEP20
