// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

// Runs a command after its arguments have been parsed; returns an EExitStatus.
using TRun = std::function<int()>;

// A subcommand. `fAddArguments` adds its arguments to `command` and returns the function that runs it. Each subcommand has a
// source file of its own; main.cpp has the table.
struct TCommand {
  char const* fName;
  char const* fDescription;
  TRun (*fAddArguments)(CLI::App& command);
};

// Marks, among the remaining arguments of CLI11, the command line that "zep run" runs: it consists of all arguments after this
// one, even if they look like options.
constexpr char const* kCommandFollows = "command:";

// The default command of "zep media"; its document is that of "zep media".
constexpr char const* kListMedia = "list";

TRun AddClassesArguments(CLI::App& command);     // ClassesCommand.cpp
TRun AddConfigArguments(CLI::App& command);      // ConfigCommand.cpp
TRun AddDiffArguments(CLI::App& command);        // DiffCommand.cpp
TRun AddDoctorArguments(CLI::App& command);      // DoctorCommand.cpp
TRun AddGetArguments(CLI::App& command);         // GetCommand.cpp
TRun AddHelpArguments(CLI::App& command);        // HelpCommand.cpp
TRun AddMediaArguments(CLI::App& command);       // MediaCommand.cpp
TRun AddMofArguments(CLI::App& command);         // MofCommand.cpp
TRun AddPluginArguments(CLI::App& command);      // PluginCommand.cpp
TRun AddPluginsArguments(CLI::App& command);     // PluginsCommand.cpp
TRun AddProxyCheckArguments(CLI::App& command);  // ProxyCheckCommand.cpp
TRun AddRecordArguments(CLI::App& command);      // RecordCommand.cpp
TRun AddRemoteArguments(CLI::App& command);      // RemoteCommand.cpp
TRun AddReportArguments(CLI::App& command);      // ReportCommand.cpp
TRun AddRunArguments(CLI::App& command);         // RunCommand.cpp
TRun AddSendArguments(CLI::App& command);        // SendCommand.cpp
TRun AddShowArguments(CLI::App& command);        // ShowCommand.cpp
TRun AddUnredactArguments(CLI::App& command);    // UnredactCommand.cpp
TRun AddVerifyArguments(CLI::App& command);      // VerifyCommand.cpp
TRun AddWpadArguments(CLI::App& command);        // WpadCommand.cpp

// The subcommand of that name, which `app` owns, or null (HelpCommand.cpp).
CLI::App const* CommandNamed(CLI::App const& app, std::string const& name);

}  // namespace NQRVZEP20::zep
