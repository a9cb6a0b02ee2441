// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/Providers.h"

#include "tools/zep/output/Output.h"

#include <filesystem>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

constexpr char const* kSampleFromBinDir = "../share/zepcore/sample/smbios.bin";  // in a build tree and installed

}  // namespace

TSample BundledSample() {
  fs::path const file = (fs::read_symlink("/proc/self/exe").parent_path() / kSampleFromBinDir).lexically_normal();
  if (!fs::is_regular_file(file)) throw std::runtime_error("the sample is not installed: " + file.string() + " is missing");
  return {file.string(), "sample-server", "SAMPLE"};
}

std::optional<TSample> SampleIf(bool isWanted) { return isWanted ? std::optional(BundledSample()) : std::nullopt; }

std::vector<TPlugIn> LoadPlugInsQuietly(std::optional<TSample> const& sample) {
  TOutputGuard const guard;
  return LoadPlugIns(sample);
}

}  // namespace NQRVZEP20::zep
