// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Traces.h"

#include "collect/answer/AnswerLimits.h"
#include "collect/process/Children.h"

#include <unistd.h>

#include <filesystem>
#include <vector>

namespace NQRVZEP20 {

namespace {

namespace fs = std::filesystem;

std::vector<fs::path> EntriesOf(fs::path const& directory) {
  std::vector<fs::path> entries;
  std::error_code error;
  for (auto const& entry : fs::directory_iterator(directory, error)) entries.push_back(entry.path());
  return entries;
}

std::string TextOf(pid_t process, TProcessState const& state) {
  return std::to_string(process) + " (" + state.fName + ")" +
         (state.IsZombie() ? ", which has ended and was not waited for" : "");
}

void Add(std::vector<std::string>& traces, std::string const& trace) {
  if (traces.size() < kMostTraces) traces.push_back(trace);
}

}  // namespace

std::map<int, std::string> OpenDescriptors() {
  std::map<int, std::string> open;
  for (fs::path const& entry : EntriesOf("/proc/self/fd")) {
    std::error_code error;
    fs::path const target = fs::read_symlink(entry, error);  // an error for the descriptor that read the directory
    if (!error) open[std::stoi(entry.filename().string())] = target.string();
  }
  return open;
}

TTraces TracesSince(std::map<int, std::string> const& before) {
  TTraces traces;
  for (auto const& [fd, target] : OpenDescriptors()) {
    auto const known = before.find(fd);
    if (known == before.end() || known->second != target) Add(traces.fDescriptors, std::to_string(fd) + " (" + target + ")");
  }
  for (pid_t const child : Children())
    if (auto const state = StateOf(child)) Add(traces.fProcesses, TextOf(child, *state));
  for (pid_t const orphan : Children(::getppid())) {
    auto const state = StateOf(orphan);
    if (orphan != ::getpid() && state && !state->IsZombie()) Add(traces.fProcesses, TextOf(orphan, *state));
  }
  return traces;
}

}  // namespace NQRVZEP20
