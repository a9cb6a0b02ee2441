// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/bundle/CollectorLog.h"

#include "TLogger.h"
#include "collect/SafeText.h"
#include "tools/zep/secrets/Secrets.h"

#include <sstream>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kLabels[] = {"[Error] ", "[Warning] ", "[Status] "};  // by severity

bool IsImportant(ILogger::TLogEntry const& entry) {
  return entry.fSeverity >= ILogger::kLogError && entry.fSeverity <= ILogger::kLogStatus;
}

std::string LineOf(std::string const& text) { return Printable(MessageWithoutSecrets(text)) + "\n"; }

std::string WordsOf(TPlugIn const& plugIn) {
  std::istringstream words(plugIn.fWords);
  std::string lines;
  for (std::string line; std::getline(words, line);) lines += LineOf("plug-in " + plugIn.fName + " printed: " + line);
  return lines;
}

}  // namespace

std::string CollectorLog(std::vector<TPlugIn> const& plugIns) {
  std::string log;
  for (ILogger::TLogEntry const& entry : TLogger::GetInstance()->GetLog())
    if (IsImportant(entry)) log += LineOf(entry.fTimeStamp.ToString() + " " + kLabels[entry.fSeverity] + entry.fMessage);
  for (std::string const& failure : FailuresOf(plugIns)) log += LineOf("plug-in failed: " + failure);
  for (TPlugIn const& plugIn : plugIns) log += WordsOf(plugIn);
  return log;
}

}  // namespace NQRVZEP20::zep
