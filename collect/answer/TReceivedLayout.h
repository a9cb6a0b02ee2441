// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/answer/TReceivedProperty.h"
#include "collect/answer/TRecordedFailure.h"

#include <optional>
#include <vector>

namespace NQRVZEP20 {

// What instances of one class share: the properties in their order.
struct TReceivedLayout {
  std::size_t fClass = 0;                         // its number
  std::optional<TRecordedFailure> fClassFailure;  // thrown by GetClass instead
  std::vector<TReceivedPropertyName> fProperties;
};

}  // namespace NQRVZEP20
