// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/completion/CommandWords.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <regex>

namespace NQRVZEP20::zep {

namespace {

// The description up to the first sign that ends a sentence or a part of it.
std::string ShortText(std::string text) {
  std::replace(text.begin(), text.end(), '\n', ' ');
  for (char const* const end : {". ", ": ", "; "}) text = text.substr(0, text.find(end));
  return text;
}

// "text", "json" and "jsonl" of the type "NAME:text, json or jsonl"; none of "INT:INT in [1 - 10]".
std::vector<std::string> ChoicesIn(std::string const& type) {
  static std::regex const list("[A-Z]*:[a-z0-9-]+(, [a-z0-9-]+)*( or [a-z0-9-]+)?"), word("[a-z0-9-]+"), separator(", | or ");
  if (!std::regex_match(type, list)) return {};
  std::string const words = type.substr(type.find(':') + 1);
  return {std::sregex_token_iterator(words.begin(), words.end(), separator, -1), std::sregex_token_iterator()};
}

TOptionWords WordsOf(CLI::Option const& option) {
  TOptionWords words;
  for (std::string const& name : option.get_snames()) words.fNames.push_back("-" + name);
  for (std::string const& name : option.get_lnames()) words.fNames.push_back("--" + name);
  words.fText = ShortText(option.get_description());
  words.fTakesValue = option.get_expected_min() > 0;
  words.fChoices = ChoicesIn(option.get_type_name());
  return words;
}

}  // namespace

TCommandWords WordsOf(CLI::App const& command, std::string const& path) {
  TCommandWords words;
  words.fPath = path;
  words.fText = ShortText(command.get_description());
  for (CLI::Option const* const option : command.get_options())
    if (option->nonpositional())
      words.fOptions.push_back(WordsOf(*option));
    else
      words.fTakesArguments = true;
  for (CLI::App const* const below : command.get_subcommands({}))
    words.fCommands.push_back(WordsOf(*below, path + (path.empty() ? "" : "/") + below->get_name()));
  return words;
}

std::vector<TCommandWords const*> AllOf(TCommandWords const& command) {
  std::vector<TCommandWords const*> all = {&command};
  for (TCommandWords const& below : command.fCommands)
    for (TCommandWords const* const each : AllOf(below)) all.push_back(each);
  return all;
}

}  // namespace NQRVZEP20::zep
