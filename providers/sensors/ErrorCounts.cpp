// SPDX-License-Identifier: Apache-2.0
#include "ErrorCounts.h"

#include <charconv>
#include <sstream>

namespace NQRVZEP20 {

namespace {

std::string const kControllers = "/sys/devices/system/edac/mc/";
std::string const kFunctions = "/sys/bus/pci/devices/";

bool BeginsWith(std::string const& text, std::string const& beginning) {
  return text.compare(0, beginning.size(), beginning) == 0;
}

bool IsModule(std::string const& entry) { return BeginsWith(entry, "dimm") || BeginsWith(entry, "rank"); }

TFinding<std::uint64_t> CountIn(TMachineFiles const& files, std::string const& path) { return files.Number<std::uint64_t>(path); }

TMissing NotOfModule() { return {kMissingNotApplicable, "the counts of a controller belong to no module"}; }

TMemoryErrors ControllerErrors(TMachineFiles const& files, std::string const& name, std::string const& directory) {
  return {name, NotOfModule(), NotOfModule(), CountIn(files, directory + "ce_noinfo_count"),
          CountIn(files, directory + "ue_noinfo_count")};
}

TMemoryErrors ModuleErrors(TMachineFiles const& files, std::string const& name, std::string const& directory) {
  return {name, files.Line(directory + "dimm_label"), files.Line(directory + "dimm_location"),
          CountIn(files, directory + "dimm_ce_count"), CountIn(files, directory + "dimm_ue_count")};
}

TFinding<TAerCounters> CountersIn(TMachineFiles const& files, std::string const& path) {
  return files.Content(path).Then(AerCountersFrom);
}

TFinding<std::uint64_t> TotalOf(TFinding<TAerCounters> const& counters) {
  return counters.Then([](TAerCounters const& values) { return values.fTotal; });
}

void AppendKinds(std::vector<std::string>& kinds, TFinding<TAerCounters> const& counters) {
  if (counters) kinds.insert(kinds.end(), counters->fOccurred.begin(), counters->fOccurred.end());
}

}  // namespace

std::vector<TMemoryErrors> ReadMemoryErrors(TMachineFiles const& files) {
  std::vector<TMemoryErrors> errors;
  for (std::string const& controller : files.Names(kControllers)) {
    if (!BeginsWith(controller, "mc")) continue;
    std::string const directory = kControllers + controller + "/";
    errors.push_back(ControllerErrors(files, controller, directory));
    for (std::string const& entry : files.Names(directory))
      if (IsModule(entry)) errors.push_back(ModuleErrors(files, controller + " " + entry, directory + entry + "/"));
  }
  return errors;
}

std::vector<TPciErrors> ReadPciErrors(TMachineFiles const& files) {
  std::vector<TPciErrors> errors;
  for (std::string const& address : files.Names(kFunctions)) {
    std::string const path = kFunctions + address + "/aer_dev_";
    auto const correctable = CountersIn(files, path + "correctable");
    if (!correctable && correctable.Why().fCode == kMissingNotGiven) continue;  // the function has no such counters
    auto const nonFatal = CountersIn(files, path + "nonfatal"), fatal = CountersIn(files, path + "fatal");
    std::vector<std::string> kinds;
    for (auto const* counters : {&correctable, &nonFatal, &fatal}) AppendKinds(kinds, *counters);
    errors.push_back({address, TotalOf(correctable), TotalOf(nonFatal), TotalOf(fatal), kinds});
  }
  return errors;
}

TFinding<TAerCounters> AerCountersFrom(std::string const& text) {
  TAerCounters counters;
  bool hasTotal = false;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    std::size_t const blank = line.find_last_of(' ');
    std::uint64_t count = 0;
    char const* const end = line.data() + line.size();
    auto const [stop, error] = std::from_chars(line.data() + (blank == std::string::npos ? 0 : blank + 1), end, count);
    if (blank == std::string::npos || error != std::errc() || stop != end)
      return TMissing{kMissingUnexpected, "\"" + line + "\" is not a counter of PCI Express errors"};
    if (BeginsWith(line, "TOTAL_"))
      counters.fTotal = count, hasTotal = true;
    else if (count > 0)
      counters.fOccurred.push_back(line);
  }
  if (!hasTotal) return TMissing{kMissingUnexpected, "the counters of PCI Express errors have no total"};
  return counters;
}

}  // namespace NQRVZEP20
