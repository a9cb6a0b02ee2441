// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/answer/NamespaceBytes.h"

#include <string>

namespace NQRVZEP20 {

inline std::string BytesOf(ICIMNamespace const& ns) {
  std::string bytes;
  WriteNamespace(ns, [&bytes](std::string_view piece) { bytes.append(piece); });
  return bytes;
}

}  // namespace NQRVZEP20
