// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as the messages of a plug-in's process, in pieces of the size that the first byte gives. The result must be the
// same as that of all bytes at once, and each row of it a namespace or a short failure.

#include "TLogger.h"
#include "collect/process/Costs.h"
#include "collect/process/TPlugInAnswer.h"
#include "fuzz/Require.h"

#include <algorithm>
#include <cstdint>
#include <string>

using namespace NQRVZEP20;

namespace {

std::string Row(std::string const& name, std::string const& error, std::string const& stage) {
  Require(error.size() <= kLongestFailure);
  Require(error.empty() == stage.empty());
  return name + "\n" + error + "\n" + stage + "\n";
}

std::string TextOf(std::optional<TTraces> const& traces) {
  std::string text;
  if (!traces) return text;
  for (auto const* list : {&traces->fDescriptors, &traces->fProcesses}) {
    Require(list->size() <= kMostTraces);
    for (std::string const& trace : *list) {
      Require(trace.size() <= kLongestFailure);
      text += trace + "\n";
    }
  }
  return text + "complete\n";
}

std::string ResultOf(std::string_view bytes, std::size_t pieceSize) {
  TApartLimits limits;
  limits.fAnswerBytes = 2000;
  TPlugInAnswer answer("Fuzz", "libFuzz.nsp.so", limits, "", [] { return ""; });
  for (; !bytes.empty(); bytes.remove_prefix(std::min(pieceSize, bytes.size()))) answer.Add(bytes.substr(0, pieceSize));
  Require((answer.State() == TPlugInAnswer::EState::kBad) == !answer.WhyBad().empty());
  if (answer.State() != TPlugInAnswer::EState::kDone) answer.Fail({"it ended"});

  TPlugIn const plugIn = answer.Finish("");
  std::string result = Row(plugIn.fName, plugIn.fError, plugIn.fStage);
  Require(plugIn.fProviders.size() <= kMostProviders);
  for (TProviderRun const& run : plugIn.fProviders) {
    Require((run.fView != nullptr) == run.fError.empty());
    Require(run.fName.size() <= kLongestName);
    result += Row(run.fName, run.fError, run.fStage) + std::to_string(run.fPeakBytes) + "\n";
    for (TClassCost const& cost : run.fCosts) result += BytesOf(cost) + "\n";
  }
  if (plugIn.fLogsDebug) result += "logs debug\n";
  result += TextOf(plugIn.fTraces);
  Require(plugIn.fUndefinedSymbols.size() <= kMostUndefinedSymbols);
  for (std::string const& symbol : plugIn.fUndefinedSymbols) {
    Require(symbol.size() <= kLongestName);
    result += symbol + "\n";
  }
  return result;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  TLogger::SetLogThreshold(static_cast<ILogger::EZEPLogSeverity>(-1));
  if (size == 0) return 0;
  std::string_view const bytes(reinterpret_cast<char const*>(data) + 1, size - 1);
  Require(ResultOf(bytes, data[0] + std::size_t{1}) == ResultOf(bytes, bytes.size() + 1));
  return 0;
}
