// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/TChildProcess.h"

#include "tools/zep/processes/WriteWhole.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <system_error>

namespace NQRVZEP20::zep {

namespace {

struct TPipe {
  TUniqueFd fReadEnd, fWriteEnd;
};

TPipe PipeOrThrow() {
  int ends[2];
  if (::pipe2(ends, O_CLOEXEC) != 0) throw std::system_error(errno, std::generic_category(), "a pipe cannot be created");
  return {TUniqueFd(ends[0]), TUniqueFd(ends[1])};
}

pid_t ForkOrThrow() {
  pid_t const child = ::fork();
  if (child < 0) throw std::system_error(errno, std::generic_category(), "a process cannot be created");
  return child;
}

[[noreturn]] void WorkInChild(std::function<void(TSend const&)> const& work, pid_t owner, int signalOfOrphan, int output) {
  ::prctl(PR_SET_PDEATHSIG, signalOfOrphan);
  if (::getppid() != owner) ::raise(signalOfOrphan);  // it had died before
  try {
    work([output](std::string_view text) {
      if (!WriteWhole(output, text)) throw std::system_error(errno, std::generic_category(), "the result cannot be sent");
    });
  } catch (...) {
    ::_exit(1);  // the owner sees that the end is missing
  }
  ::_exit(0);
}

}  // namespace

TChildProcess::TChildProcess(std::function<std::string()> const& work, int signalOfOrphan)
    : TChildProcess([&work](TSend const& send) { send(work()); }, signalOfOrphan) {}

TChildProcess::TChildProcess(std::function<void(TSend const&)> const& work, int signalOfOrphan) {
  TPipe pipe = PipeOrThrow();
  pid_t const owner = ::getpid();
  fId = ForkOrThrow();
  if (fId == 0) WorkInChild(work, owner, signalOfOrphan, pipe.fWriteEnd.get());
  fOutput = std::move(pipe.fReadEnd);
}

TChildProcess::~TChildProcess() { Kill(); }

TChildProcess::TChildProcess(TChildProcess&& other) noexcept
    : fOutput(std::move(other.fOutput)), fId(std::exchange(other.fId, -1)) {}

TChildProcess& TChildProcess::operator=(TChildProcess&& other) noexcept {
  std::swap(fOutput, other.fOutput);
  std::swap(fId, other.fId);
  return *this;
}

bool TChildProcess::Read(std::string& text) {
  char chunk[4096];
  ssize_t const got = ::read(Output(), chunk, sizeof chunk);
  if (got < 0 && errno == EINTR) return true;
  if (got <= 0) return false;
  text.append(chunk, static_cast<std::size_t>(got));
  return true;
}

bool TChildProcess::End() {
  int status = -1;
  if (fId > 0) {
    while (::waitpid(fId, &status, 0) < 0 && errno == EINTR) continue;
  }
  fId = -1;
  fOutput = TUniqueFd();
  return status == 0;
}

void TChildProcess::Kill() {
  if (fId > 0) ::kill(fId, SIGKILL);
  End();
}

}  // namespace NQRVZEP20::zep
