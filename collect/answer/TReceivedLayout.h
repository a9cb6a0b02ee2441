// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "CIMNames.h"
#include "collect/answer/TReceivedProperty.h"
#include "collect/answer/TRecordedFailure.h"

#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

// The properties, in order, that instances of one class share.
struct TReceivedLayout {
  std::size_t fClass = 0;                         // the index of the class
  std::optional<TRecordedFailure> fClassFailure;  // if set, GetClass throws it
  std::vector<TReceivedPropertyName> fProperties;
  std::unordered_map<std::string, std::size_t, TNameHash, TNameEqual>
      fNumbers;  // of the properties; of two with one name the first
};

}  // namespace NQRVZEP20
