// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/redaction/ESecretKind.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The secret that a value is or contains.
enum class EMeaning {
  kSerial,
  kHost,
  kDomain,
  kAddress,
  kUrl,  // of a service, or its host or address with or without a port
  kUser,
  kPassword,
  kSource,      // of a mount (SettingTexts.h)
  kOptions,     // of a mount
  kCommandLine  // of the kernel
};

// The meaning of a property of a class; none if it holds no secret. `classes` is the class of the instance and its superclasses.
// Some names, such as SerialNumber, are secrets in every class, also in those of unknown plug-ins.
std::optional<EMeaning> MeaningOfProperty(std::vector<std::string> const& classes, std::string_view property);

// The same for a row of the identity or the details, by its key: "serialNumber".
std::optional<EMeaning> MeaningOfRow(std::string_view key);

// The kind of the secret; of a text with several ones, that of the first.
ESecretKind KindOf(EMeaning meaning);

// Whether an element of OtherIdentifyingInfo with this description is a serial number: "Serial number", "NAA".
bool DescribesSerial(std::string_view description);

// Whether a property holds free text of the kernel, the firmware or an administrator, or something else in which an IPv4 address
// is not a version. IPv4 addresses are looked for in it.
bool IsFreeText(std::string_view property);

// Whether the value identifies nothing: it is shorter than three characters, consists of one repeated character, is one of the
// usual texts in place of a value ("Not Specified"), or is the same on many machines: a loopback address, a netmask, a PCI
// address, the account "root".
bool IsPlaceholder(ESecretKind kind, std::string_view value);

}  // namespace NQRVZEP20
