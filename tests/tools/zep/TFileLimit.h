// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/resource.h>
#include <csignal>

namespace NQRVZEP20::zep {

// While an object exists, no file can be written beyond `bytes` by this process and its children, as on a full file system.
class TFileLimit {
public:
  explicit TFileLimit(rlim_t bytes) : fHandler(std::signal(SIGXFSZ, SIG_IGN)) {
    ::getrlimit(RLIMIT_FSIZE, &fBefore);
    rlimit const limit{bytes, fBefore.rlim_max};
    ::setrlimit(RLIMIT_FSIZE, &limit);
  }
  ~TFileLimit() {
    ::setrlimit(RLIMIT_FSIZE, &fBefore);
    std::signal(SIGXFSZ, fHandler);
  }
  TFileLimit(TFileLimit const&) = delete;
  TFileLimit& operator=(TFileLimit const&) = delete;

private:
  void (*fHandler)(int);
  rlimit fBefore = {};
};

}  // namespace NQRVZEP20::zep
