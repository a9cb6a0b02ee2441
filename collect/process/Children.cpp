// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Children.h"

#include <signal.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <string>

namespace NQRVZEP20 {

namespace {

constexpr std::chrono::seconds kTimeToEnd(10);
constexpr useconds_t kPause = 1000;

// The kernel answers this faster than Children reads /proc, and most programs have none.
bool HasChildren() {
  siginfo_t ignored;
  return ::waitid(P_ALL, 0, &ignored, WEXITED | WNOHANG | WNOWAIT) == 0;
}

bool Contains(std::vector<pid_t> const& ids, pid_t id) { return std::find(ids.begin(), ids.end(), id) != ids.end(); }

}  // namespace

std::vector<pid_t> Children(pid_t process) {
  std::vector<pid_t> children;
  std::error_code error;
  for (auto const& thread : std::filesystem::directory_iterator("/proc/" + std::to_string(process) + "/task", error)) {
    std::ifstream list(thread.path() / "children");
    for (pid_t child; list >> child;) children.push_back(child);
  }
  return children;
}

// The name of a program may contain blanks and brackets.
std::optional<TProcessState> StateOf(pid_t process) {
  std::ifstream stream("/proc/" + std::to_string(process) + "/stat");
  std::string stat;
  std::getline(stream, stat);
  std::size_t const begin = stat.find('('), end = stat.rfind(") ");
  if (begin == stat.npos || end == stat.npos || end + 2 >= stat.size()) return std::nullopt;
  return TProcessState{stat.substr(begin + 1, end - begin - 1), stat[end + 2]};
}

TOrphans::TOrphans() : fEarlier(HasChildren() ? Children() : std::vector<pid_t>()) {
  ::prctl(PR_GET_CHILD_SUBREAPER, &fWasReaper);
  ::prctl(PR_SET_CHILD_SUBREAPER, 1);
}

TOrphans::~TOrphans() { ::prctl(PR_SET_CHILD_SUBREAPER, fWasReaper); }

// The children of one that ends become children of this process, and are found in the next turn.
void TOrphans::End(std::vector<pid_t> const& except) const {
  auto const giveUpAt = std::chrono::steady_clock::now() + kTimeToEnd;
  for (auto orphans = New(except); !orphans.empty(); orphans = New(except)) {
    for (pid_t const orphan : orphans) {
      ::kill(orphan, SIGKILL);
      ::waitpid(orphan, nullptr, WNOHANG);
    }
    if (std::chrono::steady_clock::now() > giveUpAt) return;
    ::usleep(kPause);
  }
}

std::vector<pid_t> TOrphans::New(std::vector<pid_t> const& except) const {
  std::vector<pid_t> orphans = Children();
  auto const isOther = [&](pid_t child) { return Contains(fEarlier, child) || Contains(except, child); };
  orphans.erase(std::remove_if(orphans.begin(), orphans.end(), isOther), orphans.end());
  return orphans;
}

}  // namespace NQRVZEP20
