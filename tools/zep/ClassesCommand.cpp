// zep classes: the classes of the providers' namespaces, or of a schema.

#include "ClassTree.h"
#include "Commands.h"
#include "ExitStatus.h"
#include "Failure.h"
#include "Json.h"
#include "MofFile.h"
#include "Output.h"
#include "PlugIns.h"
#include "Sample.h"
#include "Text.h"

#include <CLI/CLI.hpp>

#include <iostream>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TArguments {
  bool fAsTree = false;
  bool fAsJson = false;
  bool fSample = false;
  std::string fMofFile;
};

struct TNamespaceClasses {
  std::string fProvider, fNamespace;
  std::vector<TClassEntry> fClasses;
};

// "abstract association", or nothing.
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
    std::string const label = IsSampleSelected() ? std::string(kSampleLabel) + " " : "";
    text += text.empty() ? "" : "\n";
    text += Printable(label + ns.fNamespace + " (" + ns.fProvider + "): " + count) + "\n\n";
    text += asTree ? TreeOf(ns.fClasses) : TableOf(ns.fClasses);
  }
  return text;
}

std::string AsJson(std::vector<TNamespaceClasses> const& namespaces) {
  TJson document = DocumentHead("zep classes");
  document["namespaces"] = TJson::array();
  for (TNamespaceClasses const& ns : namespaces) {
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

struct TClasses {
  std::vector<TNamespaceClasses> fNamespaces;
  std::string fFailures;  // a line for each provider that failed
};

TClasses FindClasses(TArguments const& arguments) {
  TClasses classes;
  bool const isMof = !arguments.fMofFile.empty();
  std::vector<TPlugIn> const plugIns = isMof ? std::vector<TPlugIn>() : LoadPlugIns();
  classes.fFailures = FailuresAsText(plugIns);
  for (TNamespaceView const& view : isMof ? std::vector{ViewOfMof(arguments.fMofFile)} : ViewsOf(plugIns)) {
    std::string const failure = FailureOf([&] {
      classes.fNamespaces.push_back({view.GetProviderName(), view.GetName(), ClassesOf(*view.Get())});
    });
    if (!failure.empty()) classes.fFailures += Printable("zep: " + view.GetProviderName() + ": " + failure) + "\n";
  }
  return classes;
}

int Classes(TArguments const& arguments) {
  if (arguments.fSample) SelectSample();
  TClasses const classes = OrFailureDocument("zep classes", arguments.fAsJson, [&] { return FindClasses(arguments); });
  bool isAny = false;
  for (TNamespaceClasses const& ns : classes.fNamespaces) isAny = isAny || !ns.fClasses.empty();
  std::cerr << classes.fFailures;
  WriteOutput(arguments.fAsJson ? AsJson(classes.fNamespaces) : AsText(classes.fNamespaces, arguments.fAsTree));
  if (!isAny) std::cerr << "zep: there is no class\n";
  return !isAny ? kExitNothing : !classes.fFailures.empty() ? kExitPartial : kExitComplete;
}

}  // namespace

TRun AddClassesArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TArguments>();
  command.add_flag("--tree", arguments->fAsTree, "Show each class indented below its superclass");
  auto* const mof = command.add_option("--mof", arguments->fMofFile, "Show the classes of this MOF file, not the providers'");
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.add_flag("--sample", arguments->fSample, "Let the host provider describe the bundled sample, labelled SAMPLE")
      ->excludes(mof);
  command.footer(
      "Exit status: 0 when there are classes, 2 when there are but a plug-in failed, 1 when there are none,\n"
      "64 for wrong usage.");
  return [arguments] { return Classes(*arguments); };
}

}  // namespace NQRVZEP20::zep
