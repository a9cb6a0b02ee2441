// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The kinds of values that identify a machine or a person.
enum class ESecretKind {
  kSerials,    // serial numbers, UUIDs, world wide names, asset tags
  kHosts,      // names of hosts and domains
  kAddresses,  // MAC and IP addresses
  kUsers       // names of accounts and persons
};

constexpr std::array<ESecretKind, 4> kSecretKinds = {ESecretKind::kSerials, ESecretKind::kHosts, ESecretKind::kAddresses,
                                                     ESecretKind::kUsers};

// The number of different secrets of each kind.
using TSecretCounts = std::array<std::size_t, kSecretKinds.size()>;

// "serials", "hosts", "addresses" and "users".
std::string NameOf(ESecretKind kind);
std::optional<ESecretKind> SecretKindFrom(std::string_view name);

}  // namespace NQRVZEP20
