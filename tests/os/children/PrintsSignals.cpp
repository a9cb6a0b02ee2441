// SPDX-License-Identifier: Apache-2.0

// Prints the state of two signals: blocked or not, and ignored, caught or with the default action.
#include <signal.h>

#include <cstdio>
#include <initializer_list>

int main() {
  sigset_t blocked;
  ::sigprocmask(SIG_BLOCK, nullptr, &blocked);
  for (int const number : {SIGUSR1, SIGUSR2}) {
    struct sigaction action;
    ::sigaction(number, nullptr, &action);
    std::printf("%s,%s;", ::sigismember(&blocked, number) ? "blocked" : "open",
                action.sa_handler == SIG_IGN   ? "ignored"
                : action.sa_handler == SIG_DFL ? "default"
                                               : "caught");
  }
  return 0;
}
