// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "SmbiosVersion.h"
#include "TSmbiosStructure.h"
#include "providers/reasons/TMachineFiles.h"

#include <memory>
#include <string>
#include <vector>

namespace NQRVZEP20 {

class TSmbiosTables;

// The SMBIOS tables as libsmbios.so reads them: this machine's, or those of the file that the environment variable
// ZEP_SMBIOS_TABLE names, or those below the directory that ZEP_ROOT names. If the library cannot be loaded or the tables cannot
// be read, every structure is missing, with the reason.
class TSmbiosReader {
public:
  // `files`: those of this process (TMachineFiles::OfThisProcess), because libsmbios.so reads the environment variable, too.
  explicit TSmbiosReader(TMachineFiles const& files = TMachineFiles::OfThisProcess());
  ~TSmbiosReader();
  TSmbiosReader(TSmbiosReader const&) = delete;
  TSmbiosReader& operator=(TSmbiosReader const&) = delete;

  // The first structure of that type, or a missing structure, whose fields are missing with the reason.
  TSmbiosStructure First(int type) const;

  // All structures of that type, in table order; only the first if the library lacks smBiosGetNext.
  std::vector<TSmbiosStructure> All(int type) const;

  // Whether the tables are those of a file that ZEP_SMBIOS_TABLE names, which may be from another machine.
  bool IsOfNamedFile() const { return !fNamedFile.empty(); }

  // The version of the SMBIOS standard that the tables conform to, as returned by VersionOfTables.
  TFinding<std::optional<TSmbiosVersion>> Version() const;

  // The source of the values of a structure of that type: "SMBIOS type 17", or "SMBIOS type 17 (file)".
  std::string SourceOf(int type) const;

  // The reason why there is no structure of that type.
  TMissing WhyNone(int type) const;

private:
  std::unique_ptr<TSmbiosTables> fTables;  // null: the tables cannot be read, for the reason in fWhyNot
  TMissing fWhyNot;
  std::string fNamedFile;  // by ZEP_SMBIOS_TABLE; empty: the tables that the kernel exports
  std::string fKernelFile;
};

}  // namespace NQRVZEP20
