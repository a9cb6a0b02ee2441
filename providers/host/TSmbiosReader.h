// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "SmbiosVersion.h"
#include "TSmbiosStructure.h"

#include <memory>
#include <string>
#include <vector>

namespace NQRVZEP20 {

class TSmbiosTables;

// The SMBIOS tables, as libsmbios.so reads them: this machine's, or those of the file that the environment variable
// ZEP_SMBIOS_TABLE names. Where the library or the tables cannot be had, every structure is missing, with the reason.
class TSmbiosReader {
public:
  TSmbiosReader();
  ~TSmbiosReader();
  TSmbiosReader(TSmbiosReader const&) = delete;
  TSmbiosReader& operator=(TSmbiosReader const&) = delete;

  // The first structure of that type, or the one that is not there and says why.
  TSmbiosStructure First(int type) const;

  // Every structure of that type, in the order of the table. With a library that cannot go on after the first: the first.
  std::vector<TSmbiosStructure> All(int type) const;

  // The version of the standard that the tables follow, as VersionOfTables has it.
  TFinding<std::optional<TSmbiosVersion>> Version() const;

  // What the values of such a structure come from: "SMBIOS type 17", or "SMBIOS type 17 (file)".
  std::string SourceOf(int type) const;

  // Why there is no structure of that type.
  TMissing WhyNone(int type) const;

private:
  std::unique_ptr<TSmbiosTables> fTables;  // null: the tables cannot be had, for the reason in fWhyNot
  TMissing fWhyNot;
  std::string fTableFile;  // empty: this machine's own tables
};

}  // namespace NQRVZEP20
