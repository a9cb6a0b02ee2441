// SPDX-License-Identifier: Apache-2.0

// zep plugin: help for authors of provider plug-ins.

#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/plugin/NewPlugIn.h"
#include "tools/zep/plugin/SchemaFile.h"
#include "tools/zep/plugin/check/CheckOutput.h"
#include "tools/zep/plugin/check/Observation.h"
#include "tools/zep/plugin/check/Rules.h"
#include "tools/zep/secrets/Secrets.h"

#include <CLI/CLI.hpp>

#include <iostream>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TPluginArguments {
  std::string fName;
  std::string fClass;
  std::string fFile;  // to check; empty when a project is to be made
  std::string fMofFile;
  TPlugInArguments fPlugIns;
  bool fAsJson = false;
};

std::string AsText(TNewPlugIn const& made) {
  return made.fDirectory + "/ has the project of a plug-in for " + made.fClass + ": " + Joined(made.fFiles, ", ") +
         "\nNext: cd " + made.fDirectory + " && cmake -B build && cmake --build build && ctest --test-dir build\n";
}

std::string AsJson(TNewPlugIn const& made, std::string const& mofFile) {
  TJson document = DocumentHead("zep plugin new", kExitComplete, "");
  document["directory"] = made.fDirectory;
  document["class"] = made.fClass;
  document["namespace"] = made.fNamespace;
  document["schema"] = MessageWithoutSecrets(mofFile);
  document["files"] = made.fFiles;
  return zep::AsText(document);
}

int New(TPluginArguments const& arguments) {
  std::string const mofFile = arguments.fMofFile.empty() ? SchemaFile() : arguments.fMofFile;
  TNewPlugIn const made = MakePlugIn(arguments.fName, arguments.fClass, mofFile);
  WriteMessage(arguments.fAsJson ? AsJson(made, mofFile) : AsText(made));
  return kExitComplete;
}

int Check(TPluginArguments const& arguments) {
  TObservation const observation = Observe(arguments.fFile, arguments.fMofFile, arguments.fPlugIns);
  std::vector<TRuleResult> const results = CheckRules(observation);
  WriteOutput(arguments.fAsJson ? zep::AsText(CheckAsJson(observation, results)) : CheckAsText(observation, results));
  std::string const summary = SummaryOf(results);
  if (summary.empty()) return kExitComplete;
  std::cerr << "zep: " << Printable(arguments.fFile + ": " + summary) << "\n";
  return kExitNothing;
}

void AddNew(CLI::App& command, TPluginArguments& arguments) {
  command.add_option("name", arguments.fName, "The name of the plug-in and of its new directory")->required();
  command.add_option("--class", arguments.fClass, "The class of the objects that the plug-in describes")->required();
  command.add_option("--mof", arguments.fMofFile, "The MOF file that has the class");
  command.footer(
      "The directory has a CMake project: the source of the provider with every property of the class, the class in MOF,\n"
      "a test and a README. Without --mof the class is searched in the CIM schema of the DMTF: in the directory that\n"
      "ZEP_DMTF_SCHEMA names, where its archive is unpacked, or in share/zepcore/schema of the installation, where the\n"
      "package libzepcore-dev has a reduced form of it.\n"
      "Exit status: 0 when the directory was written, 1 when it was not, 64 for wrong usage.");
}

void AddCheck(CLI::App& command, TPluginArguments& arguments) {
  command.add_option("file", arguments.fFile, "The plug-in, such as build/libDisks.nsp.so")->required();
  command.add_option("--mof", arguments.fMofFile, "The MOF file with the schema that the classes are compared with");
  AddLimitOptions(command, arguments.fPlugIns);
  command.footer(
      "The plug-in is loaded twice, each time in a process of its own, and every rule is checked: its name, its symbols,\n"
      "its registration, its keys and values, its classes against the schema, its time and memory, and what it prints and\n"
      "leaves open or running. docs/zep.md describes the rules. Without --mof the schema is searched as by zep plugin new.\n"
      "Exit status: 0 when no rule has found anything, 1 when one has or the plug-in cannot be checked, 64 for wrong usage.");
}

}  // namespace

TRun AddPluginArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TPluginArguments>();
  CLI::App* const create = command.add_subcommand("new", "Write the project of a new provider plug-in");
  CLI::App* const check = command.add_subcommand("check", "Check a provider plug-in, rule by rule");
  AddNew(*create, *arguments);
  AddCheck(*check, *arguments);
  for (CLI::App* const each : {&command, create, check}) each->add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.require_subcommand(1);
  return [arguments] { return arguments->fFile.empty() ? New(*arguments) : Check(*arguments); };
}

}  // namespace NQRVZEP20::zep
