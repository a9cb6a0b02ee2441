// SPDX-License-Identifier: Apache-2.0

// zep doctor: what works on this host, and what does not.

#include "TLogger.h"
#include "collect/Sample.h"
#include "loaders/CurlLibrary.h"
#include "loaders/SmbiosLibrary.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/doctor/Checks.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"

#include <unistd.h>
#include <CLI/CLI.hpp>

#include <cstdlib>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TDoctorArguments {
  TPlugInArguments fPlugIns;
  bool fAsJson = false;
};

TSmbiosOutcome OpenSmbios() {
  TSmbiosTables const tables(TSmbiosTables::kClosedWithTables);
  return {tables.Library(), tables.OpenStatus(), tables.OpenError(), NamedTableFile()};
}

std::string Path() {
  char const* const path = std::getenv("PATH");
  return path != nullptr ? path : "";
}

// The plug-ins come first: their processes are started before any library is loaded here.
std::vector<TCheck> CheckAll(TPlugInArguments const& arguments) {
  std::vector<TPlugIn> const plugIns = LoadPlugInsFor(arguments, std::nullopt);
  std::vector<TCheck> checks = {CheckRoot(::geteuid() == 0),
                                CheckSmbios(OpenSmbios()),
                                CheckControllerDevice("/dev"),
                                CheckLibcurl(TLoadedLibrary<TCurlFunctions>().Outcome()),
                                CheckProgram("hwinfo", Path(), "hwinfo"),
                                CheckProgram("lsblk", Path(), "util-linux"),
                                CheckLogDirectory(TLogger::GetLogFileDir()),
                                CheckLogThreshold(TLogger::GetInstance()->GetLogThreshold(), plugIns)};
  std::vector<TCheck> const ofPlugIns = CheckPlugIns(plugIns, PlugInDirectory());
  checks.insert(checks.end(), ofPlugIns.begin(), ofPlugIns.end());
  return checks;
}

// "SMBIOS, hwinfo: do not work".
std::string WhyIncomplete(std::vector<TCheck> const& checks) {
  std::vector<std::string> names;
  for (TCheck const& check : checks)
    if (!check.fWorks) names.push_back(check.fName);
  return names.empty() ? "" : "not everything works: " + Joined(names, ", ");
}

std::string AsText(std::vector<TCheck> const& checks) {
  TTable table({18, 7, 51});
  table.Add({"Check", "Works", "Finding"});
  for (TCheck const& check : checks)
    table.Add({check.fName, check.fWorks ? "yes" : "no", check.fFinding + (check.fWorks ? "" : ". Remedy: " + check.fRemedy)});
  return table.GetText();
}

std::string AsJson(std::vector<TCheck> const& checks) {
  TJson document = DocumentHead("zep doctor", StatusOf(checks), WhyIncomplete(checks));
  document["checks"] = TJson::array();
  for (TCheck const& check : checks)
    document["checks"].push_back(
        {{"name", check.fName}, {"works", check.fWorks}, {"finding", check.fFinding}, {"remedy", OrNull(check.fRemedy)}});
  return zep::AsText(document);
}

int Doctor(TDoctorArguments const& arguments) {
  std::vector<TCheck> const checks = CheckAll(arguments.fPlugIns);
  WriteOutput(arguments.fAsJson ? AsJson(checks) : AsText(checks));
  return StatusOf(checks);
}

}  // namespace

TRun AddDoctorArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TDoctorArguments>();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  AddPlugInOptions(command, arguments->fPlugIns);
  command.footer(
      "Checks root, the SMBIOS tables, the device of a management controller, libcurl, hwinfo, lsblk, the log directory,\n"
      "the log threshold and every plug-in, and changes nothing.\n"
      "Exit status: 0 when everything works, 2 when something does not, 64 for wrong usage.");
  return [arguments] { return Doctor(*arguments); };
}

}  // namespace NQRVZEP20::zep
