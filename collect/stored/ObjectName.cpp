// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/ObjectName.h"

namespace NQRVZEP20 {

std::string ObjectName(TStoredInstance const& instance) {
  std::string name, facts;
  for (char const* property : {"ElementName", "Name", "DeviceID", "Tag", "InstanceID"}) {
    TStoredProperty const* const found = instance.Find(property);
    if (name.empty() && found != nullptr) name = found->fText;
  }
  for (char const* property : {"Capacity", "MaxMediaSize", "FileSystemSize", "Manufacturer", "PartNumber", "SerialNumber"}) {
    TStoredProperty const* const found = instance.Find(property);
    if (found != nullptr && !found->fText.empty()) facts += (facts.empty() ? "" : ", ") + found->fText;
  }
  if (name.empty()) return instance.fPath;
  return facts.empty() ? name : name + " (" + facts + ")";
}

}  // namespace NQRVZEP20
