// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/Providers.h"

#include "collect/PlugInsApart.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/TPlugInProgress.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/SharePath.h"

#include <CLI/CLI.hpp>

#include <filesystem>
#include <iostream>
#include <sstream>
#include <stdexcept>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

void WriteWords(TPlugIn const& plugIn) {
  std::istringstream words(plugIn.fWords);
  for (std::string line; std::getline(words, line);)
    std::cerr << "zep: plug-in " << Printable(plugIn.fName) << " printed: " << Printable(line) << "\n";
}

}  // namespace

TSample BundledSample() {
  fs::path const file = SharePath("sample/smbios.bin");
  if (!fs::is_regular_file(file)) throw std::runtime_error("the sample is not installed: " + file.string() + " is missing");
  return {file.string(), "sample-server", "SAMPLE"};
}

std::optional<TSample> SampleIf(bool isWanted) { return isWanted ? std::optional(BundledSample()) : std::nullopt; }

void AddPlugInOptions(CLI::App& command, TPlugInArguments& arguments) {
  auto* const timeout =
      command
          .add_option("--plugin-timeout", arguments.fTimeoutSeconds,
                      "The time limit in seconds for loading a plug-in, and again for filling its namespaces (default 60)")
          ->check(CLI::Range(1, 86400));
  auto* const memory =
      command
          .add_option("--plugin-memory", arguments.fMemoryMebibytes,
                      "The memory in MiB that a plug-in process may use in addition to that of zep (default: no limit)")
          ->check(CLI::Range(1, 1048576));
  command
      .add_flag("--in-process", arguments.fInProcess,
                "Load the plug-ins into the zep process, for debugging; a plug-in that crashes or hangs then takes zep with it")
      ->excludes(timeout)
      ->excludes(memory);
  command
      .add_option("--plugin", arguments.fChoice.fFiles,
                  "Also load this plug-in, from anywhere, without installing it (repeatable); it takes the place of an installed "
                  "plug-in of the same name")
      ->type_name("FILE")
      ->allow_extra_args(false);
  command.add_flag("--allow-writable", arguments.fChoice.fAllowWritable,
                   "As root, also load plug-ins that other users may replace");
}

std::vector<TPlugInFile> FindPlugInsFor(TPlugInArguments const& arguments) {
  std::vector<TPlugInFile> files = FindPlugIns(arguments.fChoice);
  for (TPlugInFile& file : files)
    if (file.fRule == EPlugInRule::kWritable) file.fReason += "; --allow-writable loads it nevertheless";
  return files;
}

std::vector<TPlugIn> LoadPlugInsFor(TPlugInArguments const& arguments, std::optional<TSample> const& sample) {
  return LoadPlugInsFor(arguments, sample, FindPlugInsFor(arguments));
}

std::vector<TPlugIn> LoadPlugInsFor(TPlugInArguments const& arguments, std::optional<TSample> const& sample,
                                    std::vector<TPlugInFile> const& files) {
  if (arguments.fInProcess) {
    TOutputGuard const guard;
    return LoadPlugIns(files, sample);
  }
  TPlugInProgress progress;
  TApartOptions options;
  options.fLimits.fTimeoutSeconds = arguments.fTimeoutSeconds;
  options.fLimits.fMemoryMebibytes = arguments.fMemoryMebibytes;
  options.fShowProgress = [&progress](std::vector<TPlugInAtWork> const& atWork) { progress.Show(atWork); };
  std::vector<TPlugIn> plugIns = LoadPlugInsApart(files, sample, options);
  for (TPlugIn const& plugIn : plugIns) WriteWords(plugIn);
  return plugIns;
}

}  // namespace NQRVZEP20::zep
