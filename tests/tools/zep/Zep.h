// SPDX-License-Identifier: Apache-2.0
#pragma once

// Runs zep as users do: the real program, as a child process, in a copy of the files of an installation.

#include "tests/SmbiosTables.h"
#include "tests/tools/zep/Documents.h"

#include <fcntl.h>
#include <grp.h>
#include <sys/wait.h>
#include <unistd.h>
#include <nlohmann/json.hpp>

#include <csignal>
#include <map>
#include <regex>

namespace NQRVZEP20::zep {

namespace fs = std::filesystem;

struct TRun {
  int fStatus;  // the exit status, or 128 and the number of the signal that ended it
  std::string fOutput, fErrors;
};

// How zep is called.
struct TCall {
  std::vector<std::string> fArguments;
  std::map<std::string, std::string> fEnvironment = {};
  bool fAsNobody = false;            // run as a user without privileges
  bool fIgnoresBrokenPipes = false;  // run with SIGPIPE ignored, as some callers do
  bool fIgnoresChildren = false;     // run with SIGCHLD ignored, as some callers do
  std::string fOutputFile = {};      // receives standard output, which is then not read back
  int fOutputDescriptor = -1;        // the same as an open descriptor; -1: none
  std::string fDirectory = {};       // the working directory; empty: the caller's
  bool fHasNoTerminal = false;       // run in a session of its own
};

// Replaces durations, which differ from run to run: "after 0.1 s" becomes "after N s".
inline std::string WithoutSeconds(std::string const& text) {
  return std::regex_replace(text, std::regex("after [0-9]+\\.[0-9] s"), "after N s");
}

class TInstallation {
public:
  TInstallation() {
    fs::permissions(fDir.Path(), fs::perms::owner_all | fs::perms::group_exec | fs::perms::others_exec | fs::perms::others_read);
    fs::create_directory(fDir.Path("lib"));
    fs::create_directory(fDir.Path("bin"));
    fs::copy(TEST_BIN_DIR "/zep", fDir.Path("bin/zep"));
    for (char const* library : {"libzepcore.so", "libzep-packing.so", "libsmbios.so", "libHost.nsp.so"})
      Add(library, std::string(TEST_LIB_DIR "/") + library);
    fs::create_directories(fDir.Path("share/zepcore"));
    fs::copy(TEST_SHARE_DIR "/zepcore", fDir.Path("share/zepcore"), fs::copy_options::recursive);
  }

  std::string Path(std::string const& name) const { return fDir.Path(name); }
  void Add(std::string const& library, std::string const& source) {
    fs::copy(source, fDir.Path("lib/" + library), fs::copy_options::overwrite_existing);
  }
  void Remove(std::string const& library) { fs::remove(fDir.Path("lib/" + library)); }

  // Writes a table file and returns its path, for ZEP_SMBIOS_TABLE.
  std::string Table(std::string const& table) {
    WriteFile(Path("table"), table);
    return Path("table");
  }

  TRun Run(TCall const& call) const {
    pid_t const child = ::fork();
    if (child == 0) Exec(call);
    int status = 0;
    ::waitpid(child, &status, 0);
    KeepDocuments(ReadFile(Path("out")));
    return {WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status), WithoutSeconds(ReadFile(Path("out"))),
            WithoutSeconds(ReadFile(Path("err")))};
  }

private:
  [[noreturn]] void Exec(TCall const& call) const {
    if (!RedirectTo(call.fOutputFile.empty() ? Path("out") : call.fOutputFile, STDOUT_FILENO)) ::_exit(126);
    if (call.fOutputDescriptor >= 0) ::dup2(call.fOutputDescriptor, STDOUT_FILENO);
    if (!RedirectTo(Path("err"), STDERR_FILENO)) ::_exit(126);
    if (!call.fDirectory.empty() && ::chdir(call.fDirectory.c_str()) != 0) ::_exit(126);
    if (call.fHasNoTerminal) ::setsid();
    std::signal(SIGPIPE, call.fIgnoresBrokenPipes ? SIG_IGN : SIG_DFL);
    std::signal(SIGCHLD, call.fIgnoresChildren ? SIG_IGN : SIG_DFL);
    for (char const* name : {"ZEP_SMBIOS_TABLE", "ZEP_HOST_NAME", "ZEP_BMC_PASSWORD", "LD_LIBRARY_PATH"}) ::unsetenv(name);
    ::setenv("ZEP_SCSI_DEVICES", Path("no-scsi-devices").c_str(), 1);  // hides the devices of this machine
    for (auto const& [name, value] : call.fEnvironment) ::setenv(name.c_str(), value.c_str(), 1);
    if (call.fAsNobody && !BecomeNobody()) ::_exit(126);

    std::string const program = Path("bin/zep");
    std::vector<char*> arguments = {const_cast<char*>("zep")};
    for (std::string const& argument : call.fArguments) arguments.push_back(const_cast<char*>(argument.c_str()));
    arguments.push_back(nullptr);
    ::execv(program.c_str(), arguments.data());
    ::_exit(127);
  }

  static bool RedirectTo(std::string const& file, int descriptor) {
    int const fd = ::open(file.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0666);
    return fd >= 0 && ::dup2(fd, descriptor) >= 0;
  }

  static bool BecomeNobody() {
    constexpr unsigned nobody = 65534;
    return ::geteuid() != 0 || (::setgroups(0, nullptr) == 0 && ::setgid(nobody) == 0 && ::setuid(nobody) == 0);
  }

  TTempDir fDir;
};

inline nlohmann::json JsonOf(TRun const& run) { return nlohmann::json::parse(run.fOutput); }

inline std::vector<std::string> LinesOf(std::string const& text) {
  std::vector<std::string> lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

}  // namespace NQRVZEP20::zep
