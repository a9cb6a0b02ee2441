// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TRecord.h"

#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

// Facts of an element for which its class has no property: values and their descriptions, for the parallel arrays
// OtherIdentifyingInfo and IdentifyingDescriptions.
class TIdentifiers {
public:
  using TTexts = TFinding<std::vector<std::string>>;

  // A missing value is omitted.
  void Add(std::string description, TFinding<std::string> const& value) {
    if (!value) return;
    fDescriptions.push_back(std::move(description));
    fValues.push_back(*value);
  }

  // Adds both arrays, which may be empty.
  void AddTo(TRecord& record) const {
    record.Add("IdentifyingDescriptions", TTexts(fDescriptions));
    record.Add("OtherIdentifyingInfo", TTexts(fValues));
  }

  // The arrays; missing for this reason if there are no values.
  TTexts Values(TMissing const& whyNone) const { return fValues.empty() ? TTexts(whyNone) : TTexts(fValues); }
  TTexts Descriptions(TMissing const& whyNone) const { return fValues.empty() ? TTexts(whyNone) : TTexts(fDescriptions); }

private:
  std::vector<std::string> fDescriptions;
  std::vector<std::string> fValues;
};

}  // namespace NQRVZEP20
