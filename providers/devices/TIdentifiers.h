// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TRecord.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// Facts of a device for which its class has no property: values and their descriptions, for the arrays OtherIdentifyingInfo and
// IdentifyingDescriptions.
class TIdentifiers {
public:
  // A missing value is omitted.
  void Add(char const* description, TFinding<std::string> const& value) {
    if (!value) return;
    fDescriptions.emplace_back(description);
    fValues.push_back(*value);
  }

  void AddTo(TRecord& record) const {
    record.Add("IdentifyingDescriptions", TFinding<std::vector<std::string>>(fDescriptions));
    record.Add("OtherIdentifyingInfo", TFinding<std::vector<std::string>>(fValues));
  }

private:
  std::vector<std::string> fDescriptions;
  std::vector<std::string> fValues;
};

}  // namespace NQRVZEP20
