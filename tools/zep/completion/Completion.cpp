// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/completion/Completion.h"

#include "tools/zep/completion/CommandWords.h"
#include "tools/zep/output/Text.h"

#include <CLI/CLI.hpp>

#include <map>

namespace NQRVZEP20::zep {

namespace {

std::string Replaced(std::string text, std::string const& part, std::string const& by) {
  for (std::size_t at = 0; (at = text.find(part, at)) != text.npos; at += by.size()) text.replace(at, part.size(), by);
  return text;
}

std::vector<std::string> NamesOfOptions(TCommandWords const& command) {
  std::vector<std::string> names;
  for (TOptionWords const& option : command.fOptions) names.insert(names.end(), option.fNames.begin(), option.fNames.end());
  return names;
}

std::vector<std::string> NamesOfCommands(TCommandWords const& command) {
  std::vector<std::string> names;
  for (TCommandWords const& below : command.fCommands) names.push_back(below.Name());
  return names;
}

// ---- bash and zsh, whose case statements are the same ----

// Sets `command` to the path of the command when a word names it.
std::string CommandCases(TCommandWords const& zep) {
  std::string cases;
  for (TCommandWords const* const command : AllOf(zep))
    if (!command->fPath.empty()) {
      std::size_t const slash = command->fPath.rfind('/');
      cases += "      " + std::string(slash == std::string::npos ? "/" : "") + command->fPath + ") command=" + command->fPath +
               " ;;\n";
    }
  return cases;
}

// Calls `complete` for each option that takes a value, with its pattern and its values.
template <class TCase>
std::string ValueCases(TCommandWords const& zep, TCase caseOf) {
  std::string cases;
  for (TCommandWords const* const command : AllOf(zep))
    for (TOptionWords const& option : command->fOptions) {
      std::vector<std::string> patterns;
      for (std::string const& name : option.fNames) patterns.push_back("'" + command->fPath + " " + name + "'");
      if (option.fTakesValue) cases += "    " + Joined(patterns, "|") + ") " + caseOf(option.fChoices) + " ;;\n";
    }
  return cases;
}

// An empty list of words makes bash complete file names (-o default).
std::string ForBash(TCommandWords const& zep) {
  std::string commands;
  for (TCommandWords const* const command : AllOf(zep)) {
    std::vector<std::string> const options = NamesOfOptions(*command), names = NamesOfCommands(*command);
    bool const isOfOptions = names.empty() && !command->fTakesArguments;
    commands += "      '" + command->fPath + "') options='" + Joined(options, " ") + "'; words='" +
                Joined(isOfOptions ? options : names, " ") + "' ;;\n";
  }
  return R"(# Completion of zep for bash, made by "zep help --completion bash".
_zep() {
  local command= options= words= i
  local word=${COMP_WORDS[COMP_CWORD]} previous=${COMP_WORDS[COMP_CWORD-1]}
  if [[ $word == = ]]; then word=; fi
  if [[ $previous == = ]]; then previous=${COMP_WORDS[COMP_CWORD-2]}; fi
  for ((i = 1; i < COMP_CWORD; ++i)); do
    case "$command/${COMP_WORDS[i]}" in
)" + CommandCases(zep) +
         R"(    esac
  done
  case "$command $previous" in
)" + ValueCases(zep, [](auto const& choices) { return "words='" + Joined(choices, " ") + "'"; }) +
         R"(    *)
      case "$command" in
)" + commands +
         R"(      esac
      if [[ $word == -* ]]; then words=$options; fi ;;
  esac
  COMPREPLY=($(compgen -W "$words" -- "$word"))
}
complete -o default -F _zep zep
)";
}

// A word and its description as _describe expects them.
std::string Described(std::string const& word, std::string const& text) {
  return "'" + word + ":" + Replaced(text, "'", "'\\''") + "'";
}

std::string ForZsh(TCommandWords const& zep) {
  std::string commands;
  for (TCommandWords const* const command : AllOf(zep)) {
    std::vector<std::string> options, names;
    for (TOptionWords const& option : command->fOptions)
      for (std::string const& name : option.fNames) options.push_back(Described(name, option.fText));
    for (TCommandWords const& below : command->fCommands) names.push_back(Described(below.Name(), below.fText));
    commands += "    '" + command->fPath + "')\n      options=(" + Joined(options, "\n        ") + ")\n      names=(" +
                Joined(names, "\n        ") + ")\n      hasFiles=" + (command->fTakesArguments ? "yes" : "") + " ;;\n";
  }
  return R"(#compdef zep
# Completion of zep for zsh, made by "zep help --completion zsh".
_zep() {
  local command= hasFiles= word previous=${words[CURRENT-1]}
  local -a options names
  if [[ $PREFIX == --*=* ]]; then
    previous=${PREFIX%%=*}
    compset -P '*='
  fi
  for word in ${words[2,CURRENT-1]}; do
    case "$command/$word" in
)" + CommandCases(zep) +
         R"(    esac
  done
  case "$command $previous" in
)" +
         ValueCases(zep,
                    [](auto const& choices) {
                      return (choices.empty() ? "_files" : "compadd -- " + Joined(choices, " ")) + "; return";
                    }) +
         R"(  esac
  case "$command" in
)" + commands +
         R"(  esac
  if [[ $PREFIX == -* || ( -z $names && -z $hasFiles ) ]]; then
    _describe -o option options
  elif [[ -n $names ]]; then
    _describe command names
  else
    _files
  fi
}
if [[ $funcstack[1] == _zep ]]; then _zep; else compdef _zep zep; fi
)";
}

// ---- fish ----

std::string FishQuoted(std::string const& text) { return "'" + Replaced(Replaced(text, "\\", "\\\\"), "'", "\\'") + "'"; }

std::string FishOption(TCommandWords const& command, TOptionWords const& option) {
  std::string line = "complete -c zep -n '__zep_is \"" + command.fPath + "\"'";
  for (std::string const& name : option.fNames)
    line += name.rfind("--", 0) == 0 ? " -l " + name.substr(2) : " -s " + name.substr(1);
  if (option.fTakesValue) line += option.fChoices.empty() ? " -r -F" : " -x -a " + FishQuoted(Joined(option.fChoices, " "));
  return line + " -d " + FishQuoted(option.fText) + "\n";
}

std::string ForFish(TCommandWords const& zep) {
  std::string cases, completions;
  for (TCommandWords const* const command : AllOf(zep)) {
    std::string const path = command->fPath, quoted = "'__zep_is \"" + path + "\"'";
    if (!path.empty())
      cases +=
          "      case '" + std::string(path.rfind('/') == path.npos ? "/" : "") + path + "'\n        set command " + path + "\n";
    if (!command->fTakesArguments) completions += "complete -c zep -n " + quoted + " -f\n";
    for (TCommandWords const& below : command->fCommands)
      completions += "complete -c zep -n " + quoted + " -a " + below.Name() + " -d " + FishQuoted(below.fText) + "\n";
    for (TOptionWords const& option : command->fOptions) completions += FishOption(*command, option);
  }
  return R"(# Completion of zep for fish, made by "zep help --completion fish".
function __zep_is
  set -l command ''
  for word in (commandline -opc)[2..]
    switch "$command/$word"
)" + cases +
         R"(    end
  end
  test "$command" = "$argv[1]"
end
)" + completions;
}

using TScript = std::string (*)(TCommandWords const& zep);

std::map<std::string, TScript> const& Scripts() {
  static std::map<std::string, TScript> const scripts = {{"bash", ForBash}, {"fish", ForFish}, {"zsh", ForZsh}};
  return scripts;
}

}  // namespace

std::vector<std::string> ShellsWithCompletion() {
  std::vector<std::string> names;
  for (auto const& [name, script] : Scripts()) names.push_back(name);
  return names;
}

std::string CompletionFor(std::string const& shell, CLI::App const& zep) { return Scripts().at(shell)(WordsOf(zep)); }

}  // namespace NQRVZEP20::zep
