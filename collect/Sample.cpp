// SPDX-License-Identifier: Apache-2.0
#include "collect/Sample.h"

#include <cstdlib>
#include <filesystem>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

constexpr char const* kTableVariable = "ZEP_SMBIOS_TABLE";
constexpr char const* kNameVariable = "ZEP_HOST_NAME";
constexpr char const* kFromFile = " (file)";  // how the host provider marks what it reads from a table file
constexpr char const* kSampleName = "sample-server";
constexpr char const* kSampleFromBinDir = "../share/zepcore/sample/smbios.bin";  // installed, and in a build tree

bool gIsSelected = false;

}  // namespace

void SelectSample() {
  fs::path const file = (fs::read_symlink("/proc/self/exe").parent_path() / kSampleFromBinDir).lexically_normal();
  if (!fs::is_regular_file(file)) throw std::runtime_error("the sample is not installed: " + file.string() + " is missing");
  ::setenv(kTableVariable, file.c_str(), 1);
  ::setenv(kNameVariable, kSampleName, 1);
  gIsSelected = true;
}

bool IsSampleSelected() { return gIsSelected; }

std::string TableFile() {
  char const* const file = std::getenv(kTableVariable);
  return file == nullptr || gIsSelected ? "" : file;
}

std::string LabelledSource(std::string const& source) {
  if (!IsSampleSelected()) return source;
  if (source == kNameVariable) return kSampleLabel;
  if (std::size_t const at = source.find(kFromFile); at != std::string::npos)
    return std::string(kSampleLabel) + ", " + source.substr(0, at);
  return source + " (not of the sample)";
}

}  // namespace NQRVZEP20::zep
