// SPDX-License-Identifier: Apache-2.0

// zep mof: loads and checks a schema.

#include "ICIMClass.h"
#include "ICIMMethodDecl.h"
#include "ICIMPropertyDecl.h"
#include "collect/ClassTree.h"
#include "collect/MofFile.h"
#include "providers/mof/Mof.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <CLI/CLI.hpp>

#include <memory>
#include <unordered_set>

namespace NQRVZEP20::zep {

namespace {

struct TMofArguments {
  std::string fFile;
  bool fPrint = false;
  bool fAsJson = false;
};

struct TCount {
  char const* fKey;    // for programs
  char const* fLabel;  // for people
  std::size_t fCount = 0;
};

// Counts the declarations of each kind in a namespace. Of the classes it keeps only the names of the indications, because a
// schema may have very many classes.
class TCensus {
public:
  explicit TCensus(ICIMNamespace const& ns) {
    ns.EnumerateQualifierDecls([&](auto const&) { return ++fQualifierDecls.fCount, true; }, TCIMContext());
    auto const countClass = [&](boost::shared_ptr<ICIMClass> cls) { return CountClass(*cls), true; };
    ns.EnumerateClasses(
        [&](boost::shared_ptr<ICIMClass> root) {
          CountClass(*root);
          root->EnumerateSubClasses(countClass, TCIMContext());
          root->EnumerateInstances([&](auto const&) { return ++fInstances.fCount, true; }, TCIMContext());
          return true;
        },
        TCIMContext());
  }

  std::vector<TCount> Counts() const {
    return {fQualifierDecls, fClasses, fAssociations, fIndications, fAbstract, fProperties, fMethods, fParameters, fInstances};
  }

private:
  void CountClass(ICIMClass const& cls) {
    ++fClasses.fCount;
    fAssociations.fCount += cls.GetClassFlag(TCIMContext());
    fIndications.fCount += IsIndication(cls);
    fAbstract.fCount += cls.IsAbstract(TCIMContext());
    cls.EnumeratePropertyDecls([&](auto const&) { return ++fProperties.fCount, true; }, TCIMContext());
    cls.EnumerateMethodDecls(
        [&](boost::shared_ptr<ICIMMethodDecl> method) {
          ++fMethods.fCount;
          method->EnumerateParameterDecls([&](auto const&) { return ++fParameters.fCount, true; }, TCIMContext());
          return true;
        },
        TCIMContext());
  }

  // Its superclass, if any, was counted before.
  bool IsIndication(ICIMClass const& cls) {
    auto const superClass = cls.GetSuperClass(TCIMContext());
    bool const isBelowOne = superClass && fIndicationNames.count(superClass->GetName(TCIMContext())) != 0;
    if (!isBelowOne && !HasSetQualifier(cls, "Indication")) return false;
    fIndicationNames.insert(cls.GetName(TCIMContext()));
    return true;
  }

  std::unordered_set<std::string> fIndicationNames;
  TCount fQualifierDecls{"qualifierDeclarations", "Qualifier declarations"};
  TCount fClasses{"classes", "Classes"};
  TCount fAssociations{"associations", "  associations"};
  TCount fIndications{"indications", "  indications"};
  TCount fAbstract{"abstractClasses", "  abstract"};
  TCount fProperties{"properties", "Properties"};
  TCount fMethods{"methods", "Methods"};
  TCount fParameters{"parameters", "  parameters"};
  TCount fInstances{"instances", "Instances"};
};

std::string AsText(std::string const& file, TCensus const& census) {
  TTable table({24, 10});
  for (TCount const& count : census.Counts()) table.Add({count.fLabel, std::to_string(count.fCount)});
  return Printable(file) + "\n\n" + table.GetText();
}

std::string AsJson(std::string const& file, TCensus const& census) {
  TJson document = DocumentHead("zep mof", kExitComplete, "");
  document["file"] = MessageWithoutSecrets(file);
  for (TCount const& count : census.Counts()) document[count.fKey] = count.fCount;
  return zep::AsText(document);
}

std::string MofAsText(TMofArguments const& arguments) {
  TNamespaceView const view = ViewOfMof(arguments.fFile);
  if (arguments.fPrint) return WriteMof(*view.Get());
  TCensus const census(*view.Get());
  return arguments.fAsJson ? AsJson(arguments.fFile, census) : AsText(arguments.fFile, census);
}

int Mof(TMofArguments const& arguments) {
  WriteOutput(MofAsText(arguments));
  return kExitComplete;
}

}  // namespace

TRun AddMofArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TMofArguments>();
  command.add_option("file", arguments->fFile, "The MOF file; it may include files in its directory and below")->required();
  auto* const print = command.add_flag("--print", arguments->fPrint, "Print the complete schema as a single MOF text");
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document")->excludes(print);
  command.footer("Exit status: 0 when the schema is correct, 1 when it is not, 64 for wrong usage.");
  return [arguments] { return Mof(*arguments); };
}

}  // namespace NQRVZEP20::zep
