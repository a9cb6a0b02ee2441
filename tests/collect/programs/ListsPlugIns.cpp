// SPDX-License-Identifier: Apache-2.0

// Loads the plug-ins, and prints a line for each plug-in and each provider: its failure, or the namespace that it filled and its
// instances. With --apart each plug-in has a process of its own; then these options may follow:
//   --timeout SECONDS, --memory MEBIBYTES, --answer BYTES, --parallel NUMBER, --log, --state (prints the state of this process
// afterwards), --words (prints words without a line end before)

#include "ICIMInstance.h"
#include "TLogger.h"
#include "TRootObject.h"
#include "collect/PlugInsApart.h"
#include "collect/process/Children.h"

#include <sys/stat.h>

#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <iterator>
#include <string>
#include <vector>

using namespace NQRVZEP20;

namespace {

std::vector<TPlugIn> Load(std::vector<std::string> const& words) {
  if (words.empty()) return LoadPlugIns();
  TApartOptions options;
  for (std::size_t at = 1; at + 1 < words.size(); at += 2) {
    int const number = std::atoi(words[at + 1].c_str());
    if (words[at] == "--timeout") options.fLimits.fTimeoutSeconds = number;
    if (words[at] == "--memory") options.fLimits.fMemoryMebibytes = static_cast<std::uint64_t>(number);
    if (words[at] == "--answer") options.fLimits.fAnswerBytes = static_cast<std::uint64_t>(number);
    if (words[at] == "--parallel") options.fParallel = static_cast<std::size_t>(number);
  }
  return LoadPlugInsApart(std::nullopt, options);
}

std::size_t CountDescriptors() {
  std::filesystem::directory_iterator const descriptors("/proc/self/fd");
  return static_cast<std::size_t>(std::distance(begin(descriptors), end(descriptors)));
}

void PrintState(std::size_t descriptors) {
  std::cout << "descriptors left: " << CountDescriptors() - descriptors << "\n";
  std::cout << "children left: " << Children().size() << "\n";
  char const* const host = std::getenv("ZEP_HOST_NAME");
  std::cout << "directory: " << std::filesystem::current_path().string() << "\n";
  std::cout << "umask: " << ::umask(0) << "\n";
  std::cout << "ZEP_HOST_NAME: " << (host == nullptr ? "not set" : host) << "\n";
}

std::string ResultOf(TPlugIn const& plugIn, TProviderRun const& run) {
  if (!run.fView) return FailurePhraseOf(plugIn, run);
  return "filled " + run.fView->GetName() + " (" + std::to_string(run.fView->AllInstances().size()) + ")";
}

}  // namespace

int main(int argc, char** argv) {
  std::ios::sync_with_stdio(false);  // std::cout has a buffer of its own
  std::vector<std::string> const words(argv + 1, argv + argc);
  if (!words.empty() && words.back() == "--words") std::cout << "words of the owner, ";
  std::size_t const descriptors = CountDescriptors();
  for (TPlugIn const& plugIn : Load(words)) {
    std::cout << "plug-in " << plugIn.fName << ": " << (plugIn.fError.empty() ? "" : FailurePhraseOf(plugIn)) << "\n";
    for (TProviderRun const& run : plugIn.fProviders)
      std::cout << "provider " << run.fName << ": " << ResultOf(plugIn, run) << "\n";
    if (!plugIn.fWords.empty()) std::cout << "words " << plugIn.fName << ": " << plugIn.fWords << "\n";
  }
  if (!words.empty() && words.back() == "--log")
    for (ILogger::TLogEntry const& entry : TRootObject::GetCoreLogger()->GetLog()) std::cout << "log: " << entry.fMessage << "\n";
  if (!words.empty() && words.back() == "--state") PrintState(descriptors);
}
