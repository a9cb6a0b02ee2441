// SPDX-License-Identifier: Apache-2.0
#include "ExtentRecord.h"

#include "TCIMSchemaHelper.h"

namespace NQRVZEP20 {

TRecord ExtentRecord(char const* className, char const* source, TSystemName const& name, std::string const& id,
                     std::string const& elementName, TFinding<std::uint64_t> const& bytes, char const* superClass) {
  TRecord record(className, source, superClass);
  record.AddKey("SystemCreationClassName", TCIMSchemaHelper::kSystemCreationClassName);
  record.AddPropagatedKey("SystemName", name.fName);
  record.AddKey("CreationClassName", className);
  record.AddKey("DeviceID", id);
  record.AddOwn("ElementName", elementName);
  record.AddOwn("Volatile", TCIMValue(true));
  record.AddOwn("BlockSize", TCIMValue(1ul));  // the schema's number for memory, which has no blocks
  record.Add("NumberOfBlocks", bytes).Unit("byte");
  return record;
}

}  // namespace NQRVZEP20
