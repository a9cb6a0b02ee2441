// SPDX-License-Identifier: Apache-2.0

// The rules of a check that concern the file and its way into a process.

#include "collect/process/EStage.h"
#include "collect/process/SharedObject.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/plugin/check/Rules.h"
#include "tools/zep/secrets/Secrets.h"

#include <algorithm>
#include <filesystem>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

std::string FileNameOf(TObservation const& observation) { return fs::path(observation.fFile.fFile).filename().string(); }

bool HasNameOfPlugIn(TObservation const& observation) { return observation.fFile.fName != FileNameOf(observation); }

std::string Readable(std::string const& error) { return MessageWithoutSecrets(Demangled(error)); }

// The failure of the load in that stage, unless a limit is its cause; empty when there is none.
std::string FailureIn(EStage stage, TObservation const& observation) {
  TPlugIn const& plugIn = observation.fFirst.fPlugIn;
  return plugIn.fStage == NameOf(stage) && plugIn.fCause.fLimit.empty() ? Readable(plugIn.fError) : "";
}

bool LacksSymbol(TObservation const& observation) { return !observation.fFirst.fPlugIn.fUndefinedSymbols.empty(); }

// Whether the rule cannot be checked, which is then reported: the file is not loaded, or its load failed elsewhere. A failure
// after the file has been opened does not concern the rules for opening it.
bool CannotCheck(EStage stage, TObservation const& observation, TRuleResult& result) {
  if (observation.WhyNotLoaded().empty() || !FailureIn(stage, observation).empty()) return false;
  bool const wasOpened = observation.fFile.IsLoaded() && observation.fFirst.fPlugIn.fStage != NameOf(EStage::kOpen);
  if (stage == EStage::kOpen && wasOpened) return false;
  result.CannotCheck(observation.WhyNotLoaded());
  return true;
}

// The types of exceptions and interfaces may be one and the same in all libraries.
bool IsOfType(std::string const& symbol) {
  constexpr char const* kPrefixes[] = {"_ZTI", "_ZTS", "_ZTV", "_ZTT"};  // typeinfo, its name, vtable, VTT
  return std::any_of(std::begin(kPrefixes), std::end(kPrefixes),
                     [&](char const* prefix) { return symbol.rfind(prefix, 0) == 0; });
}

// The shortest names, which are the easiest to read.
std::string SomeOf(std::vector<std::string> symbols) {
  constexpr std::size_t kMost = 3, kLongest = 80;
  std::stable_sort(symbols.begin(), symbols.end(),
                   [](std::string const& one, std::string const& other) { return one.size() < other.size(); });
  symbols.resize(std::min(kMost, symbols.size()));
  for (std::string& symbol : symbols) symbol = Shortened(Demangled(symbol), kLongest);
  return Joined(symbols, ", ");
}

// ---- The names that providers register ----

std::string RemedyForName(TObservation const& observation) {
  return "register the provider as \"" + observation.fFile.fName + "\", or rename the file";
}

void CheckRegisteredName(TObservation const& observation, std::string const& name, TRuleResult& result) {
  auto const& installed = observation.fInstalled;
  if (name != observation.fFile.fName && std::find(installed.begin(), installed.end(), name) != installed.end())
    result.Find("provider " + name, "it registers the name of another plug-in, which is installed as lib" + name + ".nsp.so",
                RemedyForName(observation));
}

}  // namespace

void CheckName(TObservation const& observation, TRuleResult& result) {
  TPlugInFile const& file = observation.fFile;
  if (!HasNameOfPlugIn(observation))
    result.Find(file.fFile, "its name is not lib<NAME>.nsp.so, so no host finds it",
                "rename it; zep_add_provider gives a plug-in its name");
  if (!file.IsLoaded()) result.Find(file.fFile, "it would be passed over: " + file.fReason);
  std::string const directory = PlugInDirectory();
  if (!result.HasFound() && fs::path(file.fFile).parent_path() != directory)
    result.Note(FileNameOf(observation), "hosts find it after it has been copied to " + directory);
}

void CheckLoad(TObservation const& observation, TRuleResult& result) {
  if (CannotCheck(EStage::kOpen, observation, result)) return;
  std::string const failure = FailureIn(EStage::kOpen, observation);
  if (failure.empty() || LacksSymbol(observation)) return;
  if (!IsElfFile(observation.fFile.fFile)) return result.Find(observation.fFile.fFile, "it is not an ELF file");
  result.Find(observation.fFile.fFile, "it cannot be loaded: " + failure);
}

void CheckUndefinedSymbols(TObservation const& observation, TRuleResult& result) {
  if (CannotCheck(EStage::kOpen, observation, result)) return;
  for (std::string const& symbol : observation.fFirst.fPlugIn.fUndefinedSymbols)
    result.Find(Readable(symbol), "no library defines this symbol", "link the library that defines it (zep_add_provider, LIBS)");
  if (!result.HasFound() && !FailureIn(EStage::kOpen, observation).empty()) result.CannotCheck(observation.WhyNotLoaded());
}

void CheckExports(TObservation const& observation, TRuleResult& result) {
  if (!observation.fExports) return result.CannotCheck("the file has no dynamic symbol table that can be read");
  std::vector<std::string> beyondNeed = *observation.fExports;
  beyondNeed.erase(std::remove_if(beyondNeed.begin(), beyondNeed.end(), IsOfType), beyondNeed.end());
  if (beyondNeed.empty()) return;
  result.Find(FileNameOf(observation),
              "symbols that it exports, and that may replace those of other plug-ins: " + std::to_string(beyondNeed.size()) +
                  ", such as " + SomeOf(beyondNeed),
              "build it with zep_add_provider, or with -fvisibility=hidden and a version script (ZepProvider.map)");
}

void CheckStaticConstruction(TObservation const& observation, TRuleResult& result) {
  if (CannotCheck(EStage::kConstruction, observation, result)) return;
  std::string const failure = FailureIn(EStage::kConstruction, observation);
  if (!failure.empty())
    result.Find("static construction", failure, "only register the provider there, and do all other work in the fill function");
}

void CheckRegistration(TObservation const& observation, TRuleResult& result) {
  if (CannotCheck(EStage::kRegistration, observation, result)) return;
  std::string const failure = FailureIn(EStage::kRegistration, observation);
  if (!failure.empty()) return result.Find("registration", failure);

  auto const& providers = observation.fFirst.fPlugIn.fProviders;
  if (providers.empty())
    return result.Find(FileNameOf(observation), "it registers no provider",
                       "register one in the constructor of a static object (docs/writing-a-provider.md)");
  bool hasOwnName = false;
  for (TProviderRun const& run : providers) {
    hasOwnName = hasOwnName || run.fName == observation.fFile.fName;
    if (run.fStage == NameOf(EStage::kRegistration))
      result.Find("provider " + run.fName, run.fError, "register each provider once");
    else
      CheckRegisteredName(observation, run.fName, result);
  }
  if (!hasOwnName && !result.HasFound() && HasNameOfPlugIn(observation))
    result.Find("provider " + providers.front().fName,
                "no provider has the name of the plug-in, " + observation.fFile.fName + ", by which a host finds it",
                RemedyForName(observation));
}

}  // namespace NQRVZEP20::zep
