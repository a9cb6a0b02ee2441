// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/answer/TReceivedProperty.h"
#include "collect/answer/TRecordedFailure.h"

#include <optional>
#include <vector>

namespace NQRVZEP20 {

// The properties, in order, that instances of one class share.
struct TReceivedLayout {
  std::size_t fClass = 0;                         // the index of the class
  std::optional<TRecordedFailure> fClassFailure;  // if set, GetClass throws it
  std::vector<TReceivedPropertyName> fProperties;
};

}  // namespace NQRVZEP20
