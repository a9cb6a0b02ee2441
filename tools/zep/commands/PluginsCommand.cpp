// SPDX-License-Identifier: Apache-2.0

// zep plugins: the files in the directory of plug-ins, and what became of each.

#include "collect/ClassTree.h"
#include "collect/FailureOf.h"
#include "collect/PlugInFiles.h"
#include "collect/PlugIns.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/PlugInRows.h"
#include "tools/zep/output/Text.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>
#include <map>
#include <memory>
#include <optional>

namespace NQRVZEP20::zep {

namespace {

struct TPluginsArguments {
  bool fAsJson = false;
  bool fSample = false;
  TPlugInArguments fPlugIns;
};

struct TCounts {
  std::size_t fClasses = 0, fInstances = 0;
};

// A file, and the plug-in in it unless the file is passed over.
struct TEntry {
  TPlugInFile fFile;
  std::optional<TPlugIn> fPlugIn;

  // Whether the plug-in works, or the file was not meant to be one.
  bool IsGood() const { return fPlugIn ? !fPlugIn->HasFailed() && !fPlugIn->fProviders.empty() : !fFile.fIsMeant; }
};

TCounts CountsOf(TProviderRun const& run) {
  TCounts counts;
  if (run.fView) counts = {ClassesOf(*run.fView->Get()).size(), run.fView->AllInstances().size()};
  return counts;
}

TCounts CountsOf(TPlugIn const& plugIn) {
  TCounts counts;
  for (TProviderRun const& run : plugIn.fProviders) {
    auto const [classes, instances] = CountsOf(run);
    counts.fClasses += classes;
    counts.fInstances += instances;
  }
  return counts;
}

// The rule that the plug-in broke when it was loaded; empty when it works.
std::string RuleOf(TPlugIn const& plugIn) {
  auto const isOfTakenName = [](TProviderRun const& run) { return run.fStage == "registration"; };
  if (!plugIn.fError.empty() && !IsElfFile(plugIn.fFile)) return "format";
  if (!plugIn.fUndefinedSymbols.empty()) return "undefined-symbol";
  if (!plugIn.fError.empty()) return "failed";
  if (plugIn.fProviders.empty()) return "registered-nothing";
  if (std::any_of(plugIn.fProviders.begin(), plugIn.fProviders.end(), isOfTakenName)) return "name-taken";
  return plugIn.HasFailed() ? "failed" : "";
}

// What became of it; the linker's reason for a file that is not a library is hard to understand.
std::string PhraseOf(TPlugIn const& plugIn) {
  return ResultOf(plugIn) + (RuleOf(plugIn) == "format" ? "; it is not an ELF file" : "");
}

// The plug-ins are in the order of the files.
std::vector<TEntry> EntriesOf(std::vector<TPlugInFile> const& files, std::vector<TPlugIn> const& plugIns) {
  std::vector<TEntry> entries;
  auto plugIn = plugIns.begin();
  for (TPlugInFile const& file : files) {
    entries.push_back({file, std::nullopt});
    if (plugIn == plugIns.end() || plugIn->fFile != file.fFile) continue;
    if (file.IsLoaded()) entries.back().fPlugIn = *plugIn;
    ++plugIn;
  }
  return entries;
}

std::string FileNameOf(TPlugInFile const& file) {
  std::string const directory = PlugInDirectory() + "/";
  bool const isInstalled = file.fFile.rfind(directory, 0) == 0;
  return isInstalled ? file.fFile.substr(directory.size()) : file.fFile;
}

// The reason of a problem in words; empty when there is none.
std::string ProblemOf(TEntry const& entry) {
  if (entry.IsGood()) return "";
  return FileNameOf(entry.fFile) + ": " + (entry.fPlugIn ? PhraseOf(*entry.fPlugIn) : "passed over: " + entry.fFile.fReason);
}

void AddTo(TTable& table, TEntry const& entry) {
  std::string const name = FileNameOf(entry.fFile);
  if (!entry.fPlugIn) return table.Add({name, "", "", "", "passed over: " + entry.fFile.fReason});
  TCounts const counts = CountsOf(*entry.fPlugIn);
  table.Add({name, TimeTextOf(*entry.fPlugIn), std::to_string(counts.fClasses), std::to_string(counts.fInstances),
             PhraseOf(*entry.fPlugIn)});
}

std::string AsText(std::vector<TEntry> const& entries, std::string const& label) {
  TTable table({20, 8, 7, 9, 28});
  table.Add({"File", "Time", "Classes", "Instances", "Result"});
  for (TEntry const& entry : entries) AddTo(table, entry);
  return Printable(label + "Plug-in directory: " + PlugInDirectory()) + "\n\n" + table.GetText();
}

TJson AsJson(TEntry const& entry) {
  bool const isLoaded = entry.fPlugIn && entry.fPlugIn->fError.empty();
  TJson json = {{"file", entry.fFile.fFile}, {"loaded", isLoaded}, {"plugIn", nullptr}};
  json["rule"] = OrNull(entry.fPlugIn ? RuleOf(*entry.fPlugIn) : NameOf(entry.fFile.fRule));
  json["reason"] = OrNull(entry.fPlugIn ? (entry.IsGood() ? "" : PhraseOf(*entry.fPlugIn)) : entry.fFile.fReason);
  if (!entry.fPlugIn) return json;
  TJson plugIn = PlugInAsJson(*entry.fPlugIn);
  for (std::size_t at = 0; at < entry.fPlugIn->fProviders.size(); ++at) {
    auto const [classes, instances] = CountsOf(entry.fPlugIn->fProviders[at]);
    plugIn["providers"][at]["classes"] = classes;
    plugIn["providers"][at]["instances"] = instances;
  }
  json["plugIn"] = plugIn;
  return json;
}

EExitStatus StatusOf(std::vector<TEntry> const& entries) {
  auto const isLoaded = [](TEntry const& entry) { return entry.fPlugIn && entry.IsGood(); };
  if (std::none_of(entries.begin(), entries.end(), isLoaded)) return kExitNothing;
  auto const isGood = [](TEntry const& entry) { return entry.IsGood(); };
  return std::all_of(entries.begin(), entries.end(), isGood) ? kExitComplete : kExitPartial;
}

int Plugins(TPluginsArguments const& arguments) {
  auto const sample = SampleIf(arguments.fSample);
  std::vector<TPlugInFile> const files = FindPlugInsFor(arguments.fPlugIns);
  std::vector<TEntry> const entries = EntriesOf(files, LoadPlugInsFor(arguments.fPlugIns, sample, files));
  EExitStatus const status = StatusOf(entries);
  std::vector<std::string> problems;
  for (TEntry const& entry : entries)
    if (!entry.IsGood()) problems.push_back(ProblemOf(entry));
  if (status == kExitNothing) problems.push_back("no plug-in works in " + PlugInDirectory());

  if (arguments.fAsJson) {
    TJson document = DocumentHead("zep plugins", status, Joined(problems, "; "), sample ? sample->fLabel : "");
    document["plugInDirectory"] = PlugInDirectory();
    document["files"] = TJson::array();
    for (TEntry const& entry : entries) document["files"].push_back(AsJson(entry));
    WriteOutput(zep::AsText(document));
  } else {
    WriteOutput(AsText(entries, sample ? sample->fLabel + " " : ""));
  }
  for (std::string const& problem : problems) std::cerr << "zep: " << Printable(problem) << "\n";
  return status;
}

}  // namespace

TRun AddPluginsArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TPluginsArguments>();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.add_flag("--sample", arguments->fSample, "Let the plug-ins read the bundled sample, labelled SAMPLE");
  AddPlugInOptions(command, arguments->fPlugIns);
  command.footer(
      "Exit status: 0 when every plug-in works, 2 when some do not or a file that should be one is passed over, 1 when none\n"
      "works, 64 for wrong usage.");
  return [arguments] { return Plugins(*arguments); };
}

}  // namespace NQRVZEP20::zep
