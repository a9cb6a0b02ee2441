// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/ESecretKind.h"

namespace NQRVZEP20 {

std::string NameOf(ESecretKind kind) {
  switch (kind) {
    case ESecretKind::kSerials:
      return "serials";
    case ESecretKind::kHosts:
      return "hosts";
    case ESecretKind::kAddresses:
      return "addresses";
    default:
      return "users";
  }
}

std::optional<ESecretKind> SecretKindFrom(std::string_view name) {
  for (ESecretKind const kind : kSecretKinds)
    if (NameOf(kind) == name) return kind;
  return std::nullopt;
}

}  // namespace NQRVZEP20
