// SPDX-License-Identifier: Apache-2.0
#include "HostContext.h"

#include "providers/reasons/TRecordWriter.h"

namespace NQRVZEP20 {

TMissing WhyNonePresent(TSmbiosReader const& tables, int type, std::string const& whyNonePresent) {
  bool const hasAny = static_cast<bool>(tables.First(type).Handle());
  return hasAny ? TMissing{kMissingNotGiven, whyNonePresent} : tables.WhyNone(type);
}

void WriteRecords(THostContext const& host, TRecord const& shape, std::vector<TStructureRecord> const& records,
                  TMissing const& whyNone) {
  std::vector<TRecord> written;
  for (TStructureRecord const& record : records) written.push_back(record.fRecord);
  host.fWriter.Write(shape, written, whyNone);
}

}  // namespace NQRVZEP20
