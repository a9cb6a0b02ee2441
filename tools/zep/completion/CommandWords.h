// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

struct TOptionWords {
  std::vector<std::string> fNames;  // "-h", "--help"
  std::string fText;                // the beginning of its description
  bool fTakesValue = false;
  std::vector<std::string> fChoices;  // the values; empty if it takes others, too
};

// The words that complete the command line of one command.
struct TCommandWords {
  std::string fPath;  // "media/mount"; empty for zep itself
  std::string fText;
  std::vector<TOptionWords> fOptions;
  std::vector<TCommandWords> fCommands;
  bool fTakesArguments = false;  // which are no options

  // Its last word: "mount".
  std::string Name() const { return fPath.substr(fPath.rfind('/') + 1); }
};

TCommandWords WordsOf(CLI::App const& command, std::string const& path = "");

// The command and all below it.
std::vector<TCommandWords const*> AllOf(TCommandWords const& command);

}  // namespace NQRVZEP20::zep
