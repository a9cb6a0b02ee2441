// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

// What a command does once its arguments are read; returns an EExitStatus.
using TRun = std::function<int()>;

// Each adds its command to the program, with its arguments. One file for each; main.cpp has the table of them.
struct TCommand {
  char const* fName;
  char const* fDescription;
  TRun (*fAddArguments)(CLI::App& command);
};

// Stands in front of the words that "zep run" runs, which are the rest of the remaining ones, whatever they look like.
constexpr char const* kCommandFollows = "command:";

// The command of "zep media" that is done without a word; its document is that of "zep media".
constexpr char const* kListMedia = "list";

TRun AddClassesArguments(CLI::App& command);     // ClassesCommand.cpp
TRun AddConfigArguments(CLI::App& command);      // ConfigCommand.cpp
TRun AddGetArguments(CLI::App& command);         // GetCommand.cpp
TRun AddHelpArguments(CLI::App& command);        // HelpCommand.cpp
TRun AddMediaArguments(CLI::App& command);       // MediaCommand.cpp
TRun AddMofArguments(CLI::App& command);         // MofCommand.cpp
TRun AddProxyCheckArguments(CLI::App& command);  // ProxyCheckCommand.cpp
TRun AddRemoteArguments(CLI::App& command);      // RemoteCommand.cpp
TRun AddReportArguments(CLI::App& command);      // ReportCommand.cpp
TRun AddRunArguments(CLI::App& command);         // RunCommand.cpp
TRun AddSendArguments(CLI::App& command);        // SendCommand.cpp
TRun AddShowArguments(CLI::App& command);        // ShowCommand.cpp
TRun AddWpadArguments(CLI::App& command);        // WpadCommand.cpp

// The command of that name below this one, or null (HelpCommand.cpp).
CLI::App const* CommandNamed(CLI::App const& app, std::string const& name);

}  // namespace NQRVZEP20::zep
