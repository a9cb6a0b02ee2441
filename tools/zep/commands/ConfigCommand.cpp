// SPDX-License-Identifier: Apache-2.0

// zep config: the settings of zep.cfg as the library reads them.

#include "TConfig.h"
#include "TOSSpecific.h"
#include "os/SettingLine.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Text.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <fstream>
#include <iostream>
#include <map>
#include <memory>
#include <optional>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kFileName = "zep.cfg";

struct TConfigArguments {
  std::optional<std::string> fKey;
  bool fAsJson = false;
};

struct TSetting {
  std::string fKey, fValue;
  std::size_t fLine;  // 0 when the file changed between the two readings
};

struct TIgnoredLine {
  std::size_t fLine;
  std::string fText, fKey, fReason;
};

struct TSettings {
  std::string fPath;
  std::vector<TSetting> fSettings;
  std::vector<TIgnoredLine> fIgnored;
  bool fIsCut;  // a reading error came before the end
};

// Why the library ignores a line; empty when it does not. `lineOfKey` has the keys of the lines before.
std::string ReasonToIgnore(TSettingLine const& line, std::map<std::string, std::size_t> const& lineOfKey) {
  if (line.fIsComment) return "a comment";
  if (line.fKey.empty()) return line.fValue.empty() && !line.fHasSeparator ? "an empty line" : "no key before \"=\"";
  if (line.fValue.empty()) return "no value after \"=\"";
  auto const first = lineOfKey.find(std::string(line.fKey));
  if (first != lineOfKey.end()) return "line " + std::to_string(first->second) + " already sets the key";
  return "";
}

// The library opens no other file, so a pipe of that name does not block.
bool IsReadByTheLibrary() { return TOSSpecific::FileExists(kFileName) && TOSSpecific::GetFileSize(kFileName) != 0; }

// The values come from the library; the file is read a second time for the line numbers, which the library does not report.
TSettings ReadSettings() {
  TSettings settings{TOSSpecific::GetCurrentDir() + "/" + kFileName, {}, {}, false};
  std::map<std::string, std::size_t> lineOfKey;
  std::ifstream file;
  if (IsReadByTheLibrary()) file.open(kFileName);
  std::string text;
  for (std::size_t line = 1; std::getline(file, text); ++line) {
    TSettingLine const setting = ReadSettingLine(text);
    std::string const key(setting.fKey);
    std::string const reason = ReasonToIgnore(setting, lineOfKey);
    if (reason.empty())
      lineOfKey[key] = line;
    else
      settings.fIgnored.push_back({line, text, key, reason});
  }
  settings.fIsCut = file.bad();
  for (std::string const& key : TConfig::GetInstance()->listKeys())
    settings.fSettings.push_back({key, TConfig::GetInstance()->getValue(key), lineOfKey[key]});
  return settings;
}

void KeepOnly(std::string const& key, TSettings& settings) {
  auto const isOther = [&key](auto const& entry) { return entry.fKey != key; };
  auto& kept = settings.fSettings;
  kept.erase(std::remove_if(kept.begin(), kept.end(), isOther), kept.end());
  auto& ignored = settings.fIgnored;
  ignored.erase(std::remove_if(ignored.begin(), ignored.end(), isOther), ignored.end());
}

// Blanks at either end belong to the text, so quotes show them.
std::string WithVisibleEnds(std::string const& text) {
  bool const hasBlank = !text.empty() && (text.front() == ' ' || text.back() == ' ');
  return hasBlank ? "\"" + text + "\"" : text;
}

std::string AsText(TSettings const& settings) {
  std::string text = Printable(settings.fPath) + "\n";
  if (!settings.fSettings.empty()) {
    TTable table({6, 28, 42});
    table.Add({"Line", "Key", "Value"});
    for (TSetting const& setting : settings.fSettings)
      table.Add({setting.fLine == 0 ? "?" : std::to_string(setting.fLine), WithVisibleEnds(setting.fKey),
                 WithVisibleEnds(setting.fValue)});
    text += "\n" + table.GetText();
  }
  if (!settings.fIgnored.empty()) {
    TTable table({6, 28, 42});
    table.Add({"Line", "Ignored", "Why"});
    for (TIgnoredLine const& line : settings.fIgnored)
      table.Add({std::to_string(line.fLine), WithVisibleEnds(line.fText), line.fReason});
    text += "\n" + table.GetText();
  }
  return text;
}

std::string AsJson(TSettings const& settings, EExitStatus status, std::string const& reason) {
  TJson document = DocumentHead("zep config", status, reason);
  document["file"] = settings.fPath;
  document["settings"] = TJson::array();
  for (TSetting const& setting : settings.fSettings)
    document["settings"].push_back(
        {{"key", setting.fKey}, {"value", setting.fValue}, {"line", setting.fLine == 0 ? TJson(nullptr) : TJson(setting.fLine)}});
  document["ignored"] = TJson::array();
  for (TIgnoredLine const& line : settings.fIgnored)
    document["ignored"].push_back({{"line", line.fLine}, {"text", line.fText}, {"reason", line.fReason}});
  return zep::AsText(document);
}

// Why there is no setting, or none of that key; empty when there is one.
std::string WhyNothing(TConfigArguments const& arguments, TSettings const& settings) {
  if (!settings.fSettings.empty()) return "";
  if (!TOSSpecific::FileExists(kFileName)) return settings.fPath + " does not exist";
  if (TOSSpecific::GetFileSize(kFileName) == 0) return settings.fPath + " is empty";
  if (!std::ifstream(kFileName)) return settings.fPath + " cannot be read";
  if (settings.fIsCut) return settings.fPath + " cannot be read to its end, so none of its settings is used";
  if (!arguments.fKey) return settings.fPath + " contains no settings";
  return settings.fPath + " does not set \"" + *arguments.fKey + "\"";
}

int Config(TConfigArguments const& arguments) {
  TSettings settings = ReadSettings();
  if (arguments.fKey) KeepOnly(*arguments.fKey, settings);
  bool const isAnything = !settings.fSettings.empty() || !settings.fIgnored.empty();
  std::string const why = WhyNothing(arguments, settings);
  EExitStatus const status = why.empty() ? kExitComplete : kExitNothing;
  if (isAnything || arguments.fAsJson) WriteOutput(arguments.fAsJson ? AsJson(settings, status, why) : AsText(settings));
  if (!why.empty()) std::cerr << "zep: " << Printable(why) << "\n";
  return status;
}

}  // namespace

TRun AddConfigArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TConfigArguments>();
  command.add_option("key", arguments->fKey, "Show only this setting and the ignored lines with its key");
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  command.footer(
      "The settings are those of the file zep.cfg in the working directory.\n"
      "Exit status: 0 when there are settings, 1 when there are none, 64 for wrong usage.");
  return [arguments] { return Config(*arguments); };
}

}  // namespace NQRVZEP20::zep
