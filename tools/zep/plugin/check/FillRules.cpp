// SPDX-License-Identifier: Apache-2.0

// The rules of a check that concern the process in which the plug-in fills its namespaces.

#include "collect/process/EStage.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/plugin/check/Rules.h"
#include "tools/zep/secrets/Secrets.h"

#include <sstream>

namespace NQRVZEP20::zep {

namespace {

std::string PlaceOf(TProviderRun const& run) { return "provider " + run.fName; }

std::string FailureOfRun(TProviderRun const& run) {
  std::string const logged = run.fLastLogLine.empty() ? "" : "; last log line: " + run.fLastLogLine;
  return MessageWithoutSecrets(run.fError + logged);
}

}  // namespace

void CheckFill(TObservation const& observation, TRuleResult& result) {
  if (!observation.WhyNotLoaded().empty()) return result.CannotCheck(observation.WhyNotLoaded());
  TTrial const& trial = observation.fFirst;
  if (trial.fPlugIn.fProviders.empty()) return result.CannotCheck("no provider is registered");
  if (!trial.fPlugIn.fError.empty()) result.Find("after the fill", MessageWithoutSecrets(trial.fPlugIn.fError));
  for (TProviderRun const& run : trial.fPlugIn.fProviders)
    if (run.fStage == NameOf(EStage::kFill) && run.fCause.fLimit.empty() && !run.fView)
      result.Find(PlaceOf(run), FailureOfRun(run));
  for (TContent const& content : trial.fContents)
    for (TIssue const& failure : content.fFailures) result.Find(failure.fPlace, failure.fText);
}

void CheckTimeAndMemory(TObservation const& observation, TRuleResult& result) {
  TPlugIn const& plugIn = observation.fFirst.fPlugIn;
  std::string const remedy = "do less work, or state in its documentation which --plugin-timeout or --plugin-memory it needs";
  if (!plugIn.fCause.fLimit.empty()) result.Find(plugIn.fStage, MessageWithoutSecrets(plugIn.fError), remedy);
  for (TProviderRun const& run : plugIn.fProviders)
    if (!run.fCause.fLimit.empty()) result.Find(PlaceOf(run) + ", " + run.fStage, FailureOfRun(run), remedy);
  if (!result.HasFound() && !observation.WhyNoContent().empty()) result.CannotCheck(observation.WhyNoContent());
}

void CheckLeftBehind(TObservation const& observation, TRuleResult& result) {
  auto const& traces = observation.fFirst.fPlugIn.fTraces;
  if (!traces)
    return result.CannotCheck(observation.fFile.IsLoaded() ? "its process ended too early" : observation.WhyNotLoaded());
  for (std::string const& descriptor : traces->fDescriptors)
    result.Find("descriptor " + descriptor, "it is still open after the fill", "close it");
  for (std::string const& process : traces->fProcesses)
    result.Find("process " + process, "it is left after the fill", "end it and wait for it");
}

void CheckOutput(TObservation const& observation, TRuleResult& result) {
  if (!observation.fFile.IsLoaded()) return result.CannotCheck(observation.WhyNotLoaded());
  std::istringstream words(observation.fFirst.fPlugIn.fWords);
  std::string line;
  if (std::getline(words, line))
    result.Find(
        "standard output or standard error",
        "it prints \"" + MessageWithoutSecrets(line) + "\"" + (words.eof() || words.peek() == EOF ? "" : " and more lines"),
        "write it to the log (TRootObject::GetCoreLogger)");
}

}  // namespace NQRVZEP20::zep
