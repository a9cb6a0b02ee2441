// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/WriteWhole.h"

#include <unistd.h>

#include <cerrno>

namespace NQRVZEP20::zep {

bool WriteWhole(int fd, std::string_view text) {
  while (!text.empty()) {
    ssize_t const count = ::write(fd, text.data(), text.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) return false;
    text.remove_prefix(static_cast<std::size_t>(count));
  }
  return true;
}

}  // namespace NQRVZEP20::zep
