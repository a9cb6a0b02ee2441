// SPDX-License-Identifier: Apache-2.0
#pragma once

// The DMTF CIM schema 2.49.0, which tests use when it is present. The project does not distribute it. The environment variable
// ZEP_DMTF_SCHEMA names the folder with its archive; the default is shared/data/dmtf-schema beside the source tree.

#include "tests/Support.h"

#include <cstdlib>

namespace NQRVZEP20 {

constexpr char kDmtfArchive[] = "cim_schema_2.49.0Final-MOFs.zip";
constexpr char kNoDmtfSchema[] = "the DMTF CIM schema 2.49.0 (ZEP_DMTF_SCHEMA)";

// The path of the archive; empty when it is missing.
inline std::string DmtfArchive() {
  namespace fs = std::filesystem;
  std::vector<fs::path> folders;
  if (char const* const named = ::getenv("ZEP_DMTF_SCHEMA")) folders.emplace_back(named);
  for (fs::path above = fs::path(SourcePath()).parent_path(); above != above.parent_path(); above = above.parent_path())
    folders.push_back(above / "shared/data/dmtf-schema");
  for (fs::path const& folder : folders)
    if (fs::exists(folder / kDmtfArchive)) return (folder / kDmtfArchive).string();
  return "";
}

// The schema, unpacked into a temporary folder.
class TDmtfSchema {
public:
  TDmtfSchema() {
    std::string const command = "unzip -q -d '" + fDir.Path() + "' '" + DmtfArchive() + "'";
    fIsThere = std::system(command.c_str()) == 0;
  }

  bool IsThere() const { return fIsThere; }
  std::string MainFile() const { return fDir.Path("cim_schema_2.49.0.mof"); }

private:
  TTempDir fDir;
  bool fIsThere;
};

}  // namespace NQRVZEP20
