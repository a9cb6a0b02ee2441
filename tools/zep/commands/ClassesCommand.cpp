// SPDX-License-Identifier: Apache-2.0

// zep classes: the classes of the providers' namespaces, or of a schema.

#include "collect/ClassTree.h"
#include "collect/MofFile.h"
#include "collect/PlugIns.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/PlugInRows.h"
#include "tools/zep/output/Text.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TClassesArguments {
  bool fAsTree = false;
  bool fAsJson = false;
  bool fSample = false;
  std::string fMofFile;
  TPlugInArguments fPlugIns;
};

struct TNamespaceClasses {
  std::string fProvider, fNamespace, fSampleLabel;
  std::vector<TClassEntry> fClasses;
};

// Such as "abstract association"; empty for a plain class.
std::string KindOf(TClassEntry const& entry) {
  std::string kind;
  auto const add = [&kind](bool is, char const* word) {
    if (is) kind += (kind.empty() ? "" : " ") + std::string(word);
  };
  add(entry.fIsAbstract, "abstract");
  add(entry.fIsAssociation, "association");
  add(entry.fIsIndication, "indication");
  return kind;
}

std::string TableOf(std::vector<TClassEntry> const& classes) {
  TTable table({36, 28, 12});
  table.Add({"Class", "Superclass", "Kind"});
  for (TClassEntry const& entry : classes) table.Add({entry.fName, entry.fSuperClass, KindOf(entry)});
  return table.GetText();
}

std::string TreeOf(std::vector<TClassEntry> const& classes) {
  std::string text;
  for (TClassEntry const& entry : classes) {
    std::string const kind = KindOf(entry);
    text += std::string(2 * entry.fDepth, ' ') + Printable(entry.fName) + (kind.empty() ? "" : " (" + kind + ")") + "\n";
  }
  return text;
}

std::string AsText(std::vector<TNamespaceClasses> const& namespaces, bool asTree) {
  std::string text;
  for (TNamespaceClasses const& ns : namespaces) {
    if (ns.fClasses.empty()) continue;
    std::string const count = std::to_string(ns.fClasses.size()) + (ns.fClasses.size() == 1 ? " class" : " classes");
    std::string const label = ns.fSampleLabel.empty() ? "" : ns.fSampleLabel + " ";
    text += text.empty() ? "" : "\n";
    text += Printable(label + ns.fNamespace + " (" + ns.fProvider + "): " + count) + "\n\n";
    text += asTree ? TreeOf(ns.fClasses) : TableOf(ns.fClasses);
  }
  return text;
}

struct TClasses {
  std::vector<TNamespaceClasses> fNamespaces;
  std::vector<std::string> fFailures;  // of the providers
  TJson fFailedPlugIns;
  std::string fSampleLabel;  // empty without a sample

  bool IsEmpty() const {
    return std::all_of(fNamespaces.begin(), fNamespaces.end(), [](TNamespaceClasses const& ns) { return ns.fClasses.empty(); });
  }
  EExitStatus ExitStatus() const { return IsEmpty() ? kExitNothing : fFailures.empty() ? kExitComplete : kExitPartial; }

  // Why classes are missing.
  std::vector<std::string> Reasons() const {
    std::vector<std::string> reasons = fFailures;
    if (IsEmpty()) reasons.emplace_back("no class was found");
    return reasons;
  }
};

std::string AsJson(TClasses const& found) {
  TJson document = DocumentHead("zep classes", found.ExitStatus(), Joined(found.Reasons(), "; "), found.fSampleLabel);
  document["failedPlugIns"] = found.fFailedPlugIns;
  document["namespaces"] = TJson::array();
  for (TNamespaceClasses const& ns : found.fNamespaces) {
    TJson classes = TJson::array();
    for (TClassEntry const& entry : ns.fClasses)
      classes.push_back({{"name", entry.fName},
                         {"superClass", entry.fSuperClass.empty() ? TJson(nullptr) : TJson(entry.fSuperClass)},
                         {"abstract", entry.fIsAbstract},
                         {"association", entry.fIsAssociation},
                         {"indication", entry.fIsIndication},
                         {"depth", entry.fDepth}});
    document["namespaces"].push_back({{"provider", ns.fProvider}, {"namespace", ns.fNamespace}, {"classes", classes}});
  }
  return zep::AsText(document);
}

TClasses FindClasses(TClassesArguments const& arguments) {
  TClasses classes;
  bool const isMof = !arguments.fMofFile.empty();
  auto const sample = SampleIf(arguments.fSample);
  std::vector<TPlugIn> const plugIns = isMof ? std::vector<TPlugIn>() : LoadPlugInsFor(arguments.fPlugIns, sample);
  classes.fSampleLabel = sample ? sample->fLabel : "";
  classes.fFailures = FailuresOf(plugIns);
  classes.fFailedPlugIns = FailedPlugInsAsJson(plugIns);
  for (TNamespaceView const& view : isMof ? std::vector{ViewOfMof(arguments.fMofFile)} : ViewsOf(plugIns)) {
    std::string const failure = FailureOf([&] {
      classes.fNamespaces.push_back({view.GetProviderName(), view.GetName(), view.GetSampleLabel(), ClassesOf(*view.Get())});
    });
    if (!failure.empty()) classes.fFailures.push_back(view.GetProviderName() + ": " + failure);
  }
  return classes;
}

int Classes(TClassesArguments const& arguments) {
  TClasses const classes = FindClasses(arguments);
  WriteOutput(arguments.fAsJson ? AsJson(classes) : AsText(classes.fNamespaces, arguments.fAsTree));
  for (std::string const& reason : classes.Reasons()) std::cerr << "zep: " << Printable(reason) << "\n";
  return classes.ExitStatus();
}

}  // namespace

TRun AddClassesArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TClassesArguments>();
  command.add_flag("--tree", arguments->fAsTree, "Show each class indented below its superclass");
  auto* const mof =
      command.add_option("--mof", arguments->fMofFile, "List the classes of this MOF file instead of the providers'");
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.add_flag("--sample", arguments->fSample, "List the classes for the bundled sample, labelled SAMPLE")->excludes(mof);
  AddPlugInOptions(command, arguments->fPlugIns);
  command.get_option("--plugin")->excludes(mof);
  command.footer(
      "Exit status: 0 when there are classes, 2 when there are classes but a plug-in failed, 1 when there are none,\n"
      "64 for wrong usage.");
  return [arguments] { return Classes(*arguments); };
}

}  // namespace NQRVZEP20::zep
