// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/SchemaFile.h"

#include "tools/zep/processes/SharePath.h"

#include <cstdlib>
#include <filesystem>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

constexpr char const* kVariable = "ZEP_DMTF_SCHEMA";

// "cim_schema_2.49.0.mof"; the newest when there are several. Empty when there is none.
std::string MainFileIn(fs::path const& directory) {
  std::string newest;
  std::error_code ignored;
  for (fs::directory_entry const& entry : fs::directory_iterator(directory, ignored)) {
    std::string const name = entry.path().filename().string();
    bool const isMain = name.rfind("cim_schema_", 0) == 0 && entry.path().extension() == ".mof";
    if (isMain && entry.path().string() > newest) newest = entry.path().string();
  }
  return newest;
}

std::string NamedSchema(fs::path const& path) {
  if (!fs::is_directory(path)) return path.string();
  std::string const main = MainFileIn(path);
  if (main.empty())
    throw std::runtime_error(
        path.string() + ", which " + kVariable +
        " names, has no file cim_schema_VERSION.mof; unpack the archive of the DMTF CIM schema there, or name a "
        "MOF file with --mof");
  return main;
}

}  // namespace

std::string SchemaFile() {
  if (char const* const named = std::getenv(kVariable); named != nullptr && *named != '\0') return NamedSchema(named);
  fs::path const shared = SharePath("schema");
  std::string const main = MainFileIn(shared);
  if (main.empty())
    throw std::runtime_error(
        "there is no schema; name a MOF file with --mof, or unpack the DMTF CIM schema and name its directory in " +
        std::string(kVariable) + ", or unpack it to " + shared.string());
  return main;
}

}  // namespace NQRVZEP20::zep
