// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TRecord.h"

#include <string>

namespace NQRVZEP20 {

// The value of a property, or its reason in angle brackets; "none" without that property.
inline std::string ValueIn(TRecord const& record, std::string const& name) {
  for (TRecordProperty const& property : record.GetProperties())
    if (property.fName == name)
      return property.fValue.IsNull() ? "<" + property.fMissing.fReason + ">" : property.fValue.ToString();
  return "none";
}

}  // namespace NQRVZEP20
