// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Descriptors.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <limits>
#include <system_error>

namespace NQRVZEP20 {

namespace {

constexpr unsigned int kFirst = 3, kLast = std::numeric_limits<int>::max();

void CloseRange(unsigned int first, unsigned int last) {
  if (first > last || ::close_range(first, last, 0) == 0) return;
  auto const end = static_cast<unsigned int>(::sysconf(_SC_OPEN_MAX));  // a kernel before 5.9
  for (unsigned int fd = first; fd <= last && fd < end; ++fd) ::close(static_cast<int>(fd));
}

[[noreturn]] void ThrowNoPipe() { throw std::system_error(errno, std::generic_category(), "no pipe"); }

TUniqueFd AboveStandard(TUniqueFd fd) {
  if (fd.get() >= static_cast<int>(kFirst)) return fd;
  TUniqueFd moved(::fcntl(fd.get(), F_DUPFD_CLOEXEC, static_cast<int>(kFirst)));
  if (!moved) ThrowNoPipe();
  return moved;
}

}  // namespace

TPipe OpenPipe() {
  int ends[2];
  if (::pipe2(ends, O_CLOEXEC) != 0) ThrowNoPipe();
  TPipe pipe{TUniqueFd(ends[0]), TUniqueFd(ends[1])};
  pipe.fReadEnd = AboveStandard(std::move(pipe.fReadEnd));
  pipe.fWriteEnd = AboveStandard(std::move(pipe.fWriteEnd));
  ::fcntl(pipe.fReadEnd.get(), F_SETFL, O_NONBLOCK);
  return pipe;
}

void CloseAllBut(std::vector<int> kept) {
  std::sort(kept.begin(), kept.end());
  unsigned int first = kFirst;
  for (int const fd : kept) {
    if (fd < static_cast<int>(first)) continue;
    CloseRange(first, static_cast<unsigned int>(fd) - 1);
    first = static_cast<unsigned int>(fd) + 1;
  }
  CloseRange(first, kLast);
}

void MakeNull(int fd) {
  TUniqueFd null(::open("/dev/null", O_RDWR));
  if (!null || ::dup2(null.get(), fd) < 0) ::close(fd);
  if (null.get() == fd) null.release();
}

}  // namespace NQRVZEP20
