// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "core/Failure.h"
#include "core/Handles.h"
#include "core/Log.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/select.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <string_view>

namespace NQRVZEP20 {
namespace {

// ---- The program ----

// Strings in the form that exec needs: an array of pointers to copies, ended by a null pointer.
class TStringArray {
public:
  explicit TStringArray(std::vector<std::string> strings) : fStrings(std::move(strings)) {
    for (std::string& string : fStrings) fPointers.push_back(string.data());
    fPointers.push_back(nullptr);
  }
  TStringArray(TStringArray const&) = delete;
  TStringArray& operator=(TStringArray const&) = delete;

  std::vector<std::string> const& Strings() const { return fStrings; }
  char* const* Data() const { return fPointers.data(); }

private:
  std::vector<std::string> fStrings;
  std::vector<char*> fPointers;
};

std::vector<std::string> FirstAndThen(std::string const& first, std::vector<std::string> const& others) {
  std::vector<std::string> strings{first};
  strings.insert(strings.end(), others.begin(), others.end());
  return strings;
}

std::string EachWithABlank(std::vector<std::string> const& strings) {
  std::string text;
  for (std::string const& string : strings) text.append(string).append(" ");
  return text;
}

struct TProgram {
  std::string const& fPath;
  TStringArray const& fArguments;
  TStringArray const* fEnvironment;  // null: the caller's; the program is then searched on PATH
};

// Returns only when it fails.
int Exec(TProgram const& program) {
  if (program.fEnvironment == nullptr) return ::execvp(program.fPath.c_str(), program.fArguments.Data());
  return ::execve(program.fPath.c_str(), program.fArguments.Data(), program.fEnvironment->Data());
}

// ---- The pipe ----

struct TPipe {
  TUniqueFd fReadEnd, fWriteEnd;
};

// The descriptor, or a duplicate above standard error: in the child the lower descriptors become its output, and the pipe's
// are closed.
TUniqueFd AboveStandardError(int fd) {
  TUniqueFd owner(fd);
  return fd > STDERR_FILENO ? std::move(owner) : TUniqueFd(::fcntl(fd, F_DUPFD_CLOEXEC, STDERR_FILENO + 1));
}

// Closed on exec, so that a child started meanwhile by another thread does not hold this child's output open.
TPipe MakePipe() {
  int ends[2];
  if (::pipe2(ends, O_CLOEXEC) != 0) return TPipe();
  return {AboveStandardError(ends[0]), AboveStandardError(ends[1])};
}

// ---- The child ----

// Blocks every signal of the thread.
class TSignalsHeldBack {
public:
  TSignalsHeldBack() {
    sigset_t all;
    ::sigfillset(&all);
    ::pthread_sigmask(SIG_SETMASK, &all, &fOldMask);
  }
  ~TSignalsHeldBack() { ::pthread_sigmask(SIG_SETMASK, &fOldMask, nullptr); }
  TSignalsHeldBack(TSignalsHeldBack const&) = delete;
  TSignalsHeldBack& operator=(TSignalsHeldBack const&) = delete;

  sigset_t const& OldMask() const { return fOldMask; }

private:
  sigset_t fOldMask;
};

// Exec would reset the handlers, too, but signals are unblocked before it: a handler that ran in the child would change the
// caller's memory.
void DropSignalHandlers() {
  for (int number = 1; number < NSIG; ++number) {
    struct sigaction action;
    if (::sigaction(number, nullptr, &action) != 0 || action.sa_handler == SIG_DFL || action.sa_handler == SIG_IGN) continue;
    action.sa_flags = 0;
    action.sa_handler = SIG_DFL;
    ::sigaction(number, &action, nullptr);
  }
}

// Everything that the child does before exec. It still shares the caller's memory, so it changes, frees and allocates nothing.
[[noreturn]] void ExecInChild(TProgram const& program, int readEnd, int writeEnd, sigset_t const& signalMask) {
  ::close(STDOUT_FILENO);
  ::dup2(writeEnd, STDOUT_FILENO);
  ::dup2(STDOUT_FILENO, STDERR_FILENO);
  ::close(readEnd);
  ::close(writeEnd);
  DropSignalHandlers();
  ::pthread_sigmask(SIG_SETMASK, &signalMask, nullptr);
  ::_exit(Exec(program));  // 255
}

// vfork lends the child the caller's memory instead of copying its page tables, and suspends this thread until the child's exec.
// Starting a child therefore takes no longer in a large process than in a small one.
pid_t StartChildOrThrow(TProgram const& program, TPipe const& pipe) {
  TSignalsHeldBack const signals;
  pid_t const child = ::vfork();
  if (child == 0) ExecInChild(program, pipe.fReadEnd.get(), pipe.fWriteEnd.get(), signals.OldMask());
  if (child < 0) LogErrorAndThrow(kZEPStatusFail, "ERROR: ", "Fork failed");
  return child;
}

// ---- Its output and its end ----

bool CanBeWatched(TUniqueFd const& readEnd) { return readEnd.get() < FD_SETSIZE; }

// Like select: above 0 when a read would not block (data or the end of the output), 0 when the silence lasted too long, below 0
// for a failure or an interruption.
int WaitForOutput(int readEnd, int timeoutSeconds) {
  fd_set readable;
  FD_ZERO(&readable);
  FD_SET(readEnd, &readable);
  timeval limit{timeoutSeconds, 0};
  return ::select(FD_SETSIZE, &readable, nullptr, nullptr, timeoutSeconds == -1 ? nullptr : &limit);
}

constexpr std::size_t kChunkSize = 4095;
constexpr std::size_t kPipeSize = 16 * kChunkSize;  // as much as a pipe holds

// Appends each chunk up to its first zero byte; the rest of such a chunk is lost. Kept.
void AppendChunks(std::string_view text, std::string& output) {
  for (; !text.empty(); text.remove_prefix(std::min(kChunkSize, text.size()))) {
    std::string_view const chunk = text.substr(0, kChunkSize);
    output.append(chunk.substr(0, chunk.find('\0')));
  }
}

// Reads to the end of the output. Returns false, with the reason in the log, when it did not reach the end.
bool CollectOutput(int readEnd, std::string const& path, int timeoutSeconds, std::string& output) {
  std::vector<char> buffer(kChunkSize);
  for (;;) {
    int const ready = WaitForOutput(readEnd, timeoutSeconds);
    if (ready == 0) {
      LogDebug("ERROR: SpawnProcess - ", path, " TimeOut!");
      return false;
    }
    if (ready < 0) {
      LogDebug("ERROR: SpawnProcess - select call failed!");
      return false;
    }
    ssize_t const got = ::read(readEnd, buffer.data(), buffer.size());
    if (got == 0) return true;
    if (got < 0) continue;  // nothing is appended, and the loop continues. Kept.
    AppendChunks({buffer.data(), static_cast<std::size_t>(got)}, output);
    if (static_cast<std::size_t>(got) == buffer.size()) buffer.resize(kPipeSize);  // a large output is read in larger pieces
  }
}

// 0 for a child that exited with 0, -1 for any other end.
int ResultOf(pid_t child) {
  int status = 0;
  if (::waitpid(child, &status, 0) != child) {
    LogDebug("ERROR: SpawnProcess - waitpid call failed!");
    return -1;
  }
  if (WTERMSIG(status) != 0) {
    LogDebug("ERROR: SpawnProcess - Child process exited abnormally!");
    return -1;
  }
  return WEXITSTATUS(status) == 0 ? 0 : -1;
}

int Run(TProgram const& program, std::string& output, int timeoutSeconds) {
  TPipe pipe = MakePipe();
  if (!pipe.fReadEnd || !pipe.fWriteEnd) {
    LogDebug("ERROR: SpawnProcess - pipe call failed!");
    return -1;
  }
  if (!CanBeWatched(pipe.fReadEnd)) {
    LogDebug("ERROR: SpawnProcess - select call failed!");
    return -1;
  }

  pid_t const child = StartChildOrThrow(program, pipe);
  pipe.fWriteEnd.reset();
  // A child whose output was not read to the end is neither terminated nor waited for. Kept.
  if (!CollectOutput(pipe.fReadEnd.get(), program.fPath, timeoutSeconds, output)) return -1;
  return ResultOf(child);
}

// The pieces between single blanks, including empty ones.
std::vector<std::string> CutAtBlanks(std::string const& text) {
  std::vector<std::string> pieces;
  std::size_t start = 0;
  for (std::size_t blank; (blank = text.find(' ', start)) != std::string::npos; start = blank + 1)
    pieces.push_back(text.substr(start, blank - start));
  pieces.push_back(text.substr(start));
  return pieces;
}

}  // namespace

int TOSSpecific::SpawnProcess(std::string const& path, std::vector<std::string> const& args, std::string const& argv0,
                              std::vector<std::string> const& env, std::string& output, int timeout) {
  TStringArray const arguments(FirstAndThen(argv0, args));
  TStringArray const environment(env);
  if (IsLogged(ILogger::kLogDebug))
    LogDebug("TOSSpecific::SpawnProcess calling ", path, "\nwith parameters ", EachWithABlank(arguments.Strings()),
             "\nwith envoirment vars ", EachWithABlank(environment.Strings()));
  return Run({path, arguments, &environment}, output, timeout);
}

int TOSSpecific::SpawnProcess(std::string program, std::vector<std::string> args, std::string& output, int timeout) {
  TStringArray const arguments(FirstAndThen(program, args));
  LogDebug("SpawnProcess: process ", program);
  return Run({program, arguments, nullptr}, output, timeout);
}

std::string TOSSpecific::SpawnProcess(std::string program, std::vector<std::string> args, int timeout) {
  std::string output;
  SpawnProcess(std::move(program), std::move(args), output, timeout);
  return output;
}

std::string TOSSpecific::SpawnProcess(std::string commandLine, int timeout) {
  std::vector<std::string> args = CutAtBlanks(commandLine);
  std::string const program = args.front();
  args.erase(args.begin());
  return SpawnProcess(program, args, timeout);
}

}  // namespace NQRVZEP20
