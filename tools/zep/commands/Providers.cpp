// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/Providers.h"

#include "collect/PlugInsApart.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/TPlugInProgress.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
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

std::vector<TPlugIn> LoadApart(std::vector<TPlugInFile> const& files, std::optional<TSample> const& sample,
                               TPlugInArguments const& arguments, bool measures) {
  TPlugInProgress progress;
  TApartOptions options;
  options.fLimits.fTimeoutSeconds = arguments.fTimeoutSeconds;
  options.fLimits.fMemoryMebibytes = arguments.fMemoryMebibytes;
  options.fMeasures = measures;
  options.fShowProgress = [&progress](std::vector<TPlugInAtWork> const& atWork) {
    progress.Show(atWork);
    ThrowIfInterrupted();
  };
  return LoadPlugInsApart(files, sample, options);
}

}  // namespace

TSample BundledSample() {
  fs::path const file = SharePath("sample/smbios.bin");
  if (!fs::is_regular_file(file)) throw std::runtime_error("the sample is not installed: " + file.string() + " is missing");
  return {file.string(), "sample-server", "SAMPLE"};
}

std::optional<TSample> SampleIf(bool isWanted) { return isWanted ? std::optional(BundledSample()) : std::nullopt; }

void AddLimitOptions(CLI::App& command, TPlugInArguments& arguments) {
  command
      .add_option("--plugin-timeout", arguments.fTimeoutSeconds,
                  "The time limit in seconds for loading a plug-in, and again for filling its namespaces (default 60)")
      ->check(CLI::Range(1, 86400));
  command
      .add_option("--plugin-memory", arguments.fMemoryMebibytes,
                  "The memory in MiB that a plug-in process may use in addition to that of zep (default: no limit)")
      ->check(CLI::Range(1, 1048576));
  command.add_flag("--allow-writable", arguments.fChoice.fAllowWritable,
                   "As root, also load plug-ins that other users may replace");
}

void AddPlugInOptions(CLI::App& command, TPlugInArguments& arguments) {
  AddLimitOptions(command, arguments);
  command
      .add_flag("--in-process", arguments.fInProcess,
                "Load the plug-ins into the zep process, for debugging; a plug-in that crashes or hangs then takes zep with it")
      ->excludes("--plugin-timeout")
      ->excludes("--plugin-memory");
  command
      .add_option("--plugin", arguments.fChoice.fFiles,
                  "Also load this plug-in, from anywhere, without installing it (repeatable); it takes the place of an installed "
                  "plug-in of the same name")
      ->type_name("FILE")
      ->allow_extra_args(false);
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
  std::vector<TPlugIn> plugIns = LoadApart(files, sample, arguments, false);
  for (TPlugIn const& plugIn : plugIns) WriteWords(plugIn);
  return plugIns;
}

TPlugIn LoadPlugInMeasured(TPlugInFile const& file, TPlugInArguments const& arguments) {
  return LoadApart({file}, std::nullopt, arguments, true).front();
}

}  // namespace NQRVZEP20::zep
