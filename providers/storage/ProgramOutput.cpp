// SPDX-License-Identifier: Apache-2.0
#include "ProgramOutput.h"

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <sstream>
#include <thread>

namespace NQRVZEP20 {

namespace {

using TTime = std::chrono::steady_clock::time_point;

constexpr std::size_t kLimit = std::size_t(4) << 20;
constexpr auto kTimeToDie = std::chrono::milliseconds(200);

class TPipe {
public:
  TPipe() {
    if (::pipe2(fEnds, O_CLOEXEC) != 0) fEnds[0] = fEnds[1] = -1;
  }
  ~TPipe() {
    CloseWriteEnd();
    if (fEnds[0] >= 0) ::close(fEnds[0]);
  }
  TPipe(TPipe const&) = delete;
  TPipe& operator=(TPipe const&) = delete;

  int ReadEnd() const { return fEnds[0]; }
  int WriteEnd() const { return fEnds[1]; }
  void CloseWriteEnd() {
    if (fEnds[1] >= 0) ::close(fEnds[1]);
    fEnds[1] = -1;
  }

private:
  int fEnds[2];
};

// What a new program has as its standard streams.
class TStreams {
public:
  explicit TStreams(TPipe const& output) {
    ::posix_spawn_file_actions_init(&fActions);
    ::posix_spawn_file_actions_addopen(&fActions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
    ::posix_spawn_file_actions_adddup2(&fActions, output.WriteEnd(), STDOUT_FILENO);
    ::posix_spawn_file_actions_addopen(&fActions, STDERR_FILENO, "/dev/null", O_WRONLY, 0);
  }
  ~TStreams() { ::posix_spawn_file_actions_destroy(&fActions); }
  TStreams(TStreams const&) = delete;
  TStreams& operator=(TStreams const&) = delete;

  posix_spawn_file_actions_t const* Get() const { return &fActions; }

private:
  posix_spawn_file_actions_t fActions;
};

// Returns 0, or the number of the error.
int Start(std::string const& program, std::vector<std::string> arguments, TPipe const& output, pid_t& child) {
  std::vector<char*> argv{const_cast<char*>(program.c_str())};
  for (std::string& argument : arguments) argv.push_back(argument.data());
  argv.push_back(nullptr);
  TStreams const streams(output);
  return ::posix_spawn(&child, program.c_str(), streams.Get(), nullptr, argv.data(), environ);
}

int MillisecondsUntil(TTime deadline) {
  auto const left = std::chrono::duration_cast<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now()).count();
  return static_cast<int>(std::clamp<long>(left, 0, 3600 * 1000));
}

// Reads up to the end of the output. Returns false at the deadline, after too much output, or when reading fails.
bool ReadAll(int fd, TTime deadline, std::string& output) {
  char buffer[16384];
  while (output.size() <= kLimit) {
    pollfd readable{fd, POLLIN, 0};
    int const ready = ::poll(&readable, 1, MillisecondsUntil(deadline));
    if (ready < 0 && errno == EINTR) continue;
    if (ready <= 0) return false;
    ssize_t const count = ::read(fd, buffer, sizeof buffer);
    if (count == 0) return true;
    if (count < 0) return false;
    output.append(buffer, static_cast<std::size_t>(count));
  }
  return false;
}

// Kills the child and waits a little.
void End(pid_t child) {
  ::kill(child, SIGKILL);
  TTime const deadline = std::chrono::steady_clock::now() + kTimeToDie;
  while (::waitpid(child, nullptr, WNOHANG) == 0 && std::chrono::steady_clock::now() < deadline)
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
}

}  // namespace

std::string FindProgram(std::string const& name) {
  char const* const path = std::getenv("PATH");
  std::istringstream directories(std::string(path != nullptr ? path : "") + ":/usr/local/sbin:/usr/sbin:/sbin");
  for (std::string directory; std::getline(directories, directory, ':');) {
    std::string const file = directory + "/" + name;
    if (!directory.empty() && directory[0] == '/' && ::access(file.c_str(), X_OK) == 0) return file;
  }
  return "";
}

TFinding<std::string> OutputOf(std::string const& program, std::vector<std::string> const& arguments, TTime deadline) {
  TPipe output;
  pid_t child = -1;
  int const error = output.ReadEnd() < 0 ? errno : Start(program, arguments, output, child);
  if (error != 0) return TMissing{kMissingUnreadable, program + " cannot be started: " + std::strerror(error)};
  output.CloseWriteEnd();
  std::string text;
  if (ReadAll(output.ReadEnd(), deadline, text)) {
    ::waitpid(child, nullptr, 0);
    return text;
  }
  End(child);
  if (text.size() > kLimit) return TMissing{kMissingUnexpected, program + " wrote too much"};
  return TMissing{kMissingUnreadable, program + " did not end within its time limit"};
}

}  // namespace NQRVZEP20
