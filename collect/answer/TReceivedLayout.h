// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/answer/TReceivedPropertyDecl.h"
#include "collect/answer/TRecordedFailure.h"

#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// What instances of one class share: the properties in their order.
struct TReceivedLayout {
  struct TProperty {
    std::string fName;
    boost::shared_ptr<TReceivedPropertyDecl const> fDeclaration;  // may be empty
  };

  std::size_t fClass = 0;                         // its number
  std::optional<TRecordedFailure> fClassFailure;  // thrown by GetClass instead
  std::vector<TProperty> fProperties;
};

}  // namespace NQRVZEP20
