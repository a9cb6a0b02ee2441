// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/check/Observation.h"

#include "collect/MofFile.h"
#include "collect/process/EStage.h"
#include "collect/process/SharedObject.h"
#include "tools/zep/plugin/SchemaFile.h"

#include <chrono>
#include <stdexcept>
#include <thread>

namespace NQRVZEP20::zep {

namespace {

TTrial Try(TPlugInFile const& file, TPlugInArguments const& arguments) {
  TTrial trial{LoadPlugInMeasured(file, arguments), {}};
  for (TProviderRun const& run : trial.fPlugIn.fProviders)
    if (run.fView) trial.fContents.push_back(ContentOf(*run.fView));
  return trial;
}

// A key that contains the time of day then differs from that of the first trial. The clock of time(2) may be late by up to a tick
// of the kernel.
void WaitForNextSecond() {
  constexpr std::chrono::milliseconds kLongestLag(50);
  auto const now = std::chrono::system_clock::now();
  std::this_thread::sleep_for(std::chrono::ceil<std::chrono::seconds>(now) - now + kLongestLag);
}

void FindSchema(std::string const& mofFile, TObservation& observation) {
  try {
    observation.fSchemaFile = mofFile.empty() ? SchemaFile() : mofFile;
  } catch (std::runtime_error const& failure) {
    observation.fWhyNoSchema = failure.what();
    return;
  }
  observation.fSchema = ViewOfMof(observation.fSchemaFile);
}

}  // namespace

std::string TObservation::WhyNotLoaded() const {
  if (!fFile.IsLoaded()) return "the file is not loaded";
  TPlugIn const& plugIn = fFirst.fPlugIn;
  return plugIn.fError.empty() || plugIn.fStage == NameOf(EStage::kFill) ? "" : "the plug-in could not be loaded";
}

std::string TObservation::WhyNoContent() const {
  if (!WhyNotLoaded().empty()) return WhyNotLoaded();
  return fFirst.fContents.empty() ? "no namespace was filled" : "";
}

TObservation Observe(std::string const& file, std::string const& mofFile, TPlugInArguments const& arguments) {
  TPlugInArguments chosen = arguments;
  chosen.fChoice.fFiles = {file};
  std::vector<TPlugInFile> const files = FindPlugInsFor(chosen);
  TObservation observation;
  observation.fFile = files.front();
  if (observation.fFile.fRule == EPlugInRule::kMissing) throw std::runtime_error(file + ": " + observation.fFile.fReason);
  observation.fExports = ExportedSymbols(observation.fFile.fFile);
  for (auto other = files.begin() + 1; other != files.end(); ++other)
    if (other->IsLoaded()) observation.fInstalled.push_back(other->fName);
  if (observation.fFile.IsLoaded()) observation.fFirst = Try(observation.fFile, arguments);
  if (observation.WhyNoContent().empty()) {
    WaitForNextSecond();
    observation.fSecond = Try(observation.fFile, arguments);
  }
  FindSchema(mofFile, observation);
  return observation;
}

}  // namespace NQRVZEP20::zep
