// SPDX-License-Identifier: Apache-2.0
#include "tests/os/FakeShell.h"

#include "ZEPExport.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <scsi/scsi.h>
#include <scsi/sg.h>
#include <stdarg.h>
#include <sys/ioctl.h>
#include <sys/select.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

NQRVZEP20::TFakeShell* gShell = nullptr;
bool gIsScsiFake = false;
NQRVZEP20::TFastSelect* gFastSelect = nullptr;

struct TDiskIds {
  std::uint32_t fIdLun, fUniqueHostId;
};

// 0 or an errno.
int AnswerScsi(int fd, unsigned long request, void* answer) {
  char text[64] = "";
  if (::pread(fd, text, sizeof text - 1, 0) < 0) return errno;
  unsigned host = 0, channel = 0, target = 0, lun = 0;
  bool const isDisk = std::sscanf(text, "%u %u %u %u", &host, &channel, &target, &lun) == 4;
  bool const isGeneric = std::sscanf(text, "generic %u %u %u %u", &host, &channel, &target, &lun) == 4;
  bool const isHalfADisk = std::strcmp(text, "disk without host") == 0;
  if (request == SCSI_IOCTL_GET_IDLUN && (isDisk || isHalfADisk)) {
    *static_cast<TDiskIds*>(answer) = {target | lun << 8 | channel << 16 | (host & 0xff) << 24, 0};
    return 0;
  }
  if (request == SCSI_IOCTL_GET_BUS_NUMBER && isDisk) {
    *static_cast<int*>(answer) = static_cast<int>(host);
    return 0;
  }
  if (request == SG_GET_SCSI_ID && isGeneric) {
    auto const number = [](unsigned value) { return static_cast<int>(value); };
    *static_cast<sg_scsi_id*>(answer) = {number(host), number(channel), number(target), number(lun), 0, 0, 0, {}};
    return 0;
  }
  return ENOTTY;
}

}  // namespace

// These are found by the library before those of the C library.

ZEP_EXPORT int system(char const* command) {
  if (gShell != nullptr) return gShell->Run(command);
  return reinterpret_cast<int (*)(char const*)>(::dlsym(RTLD_NEXT, "system"))(command);
}

ZEP_EXPORT int ioctl(int fd, unsigned long request, ...) noexcept {
  va_list arguments;
  va_start(arguments, request);
  void* const argument = va_arg(arguments, void*);
  va_end(arguments);
  if (!gIsScsiFake) return static_cast<int>(::syscall(SYS_ioctl, fd, request, argument));
  int const error = AnswerScsi(fd, request, argument);
  if (error == 0) return 0;
  errno = error;
  return -1;
}

ZEP_EXPORT int select(int count, fd_set* readable, fd_set* writable, fd_set* failed, timeval* limit) {
  timeval shortened;
  if (gFastSelect != nullptr && limit != nullptr) {
    gFastSelect->Add(limit->tv_sec);
    shortened = {limit->tv_sec / 100, static_cast<suseconds_t>(limit->tv_sec % 100 * 10000)};
    limit = &shortened;
  }
  return static_cast<int>(::syscall(SYS_select, count, readable, writable, failed, limit));
}

namespace NQRVZEP20 {

TFakeShell::TFakeShell(std::map<std::string, int> results, int otherwise) : fResults(std::move(results)), fOtherwise(otherwise) {
  gShell = this;
}

TFakeShell::~TFakeShell() { gShell = nullptr; }

int TFakeShell::Run(std::string const& command) {
  fCommands.push_back(command);
  auto const found = fResults.find(command);
  return found == fResults.end() ? fOtherwise : found->second;
}

TFakeScsi::TFakeScsi() { gIsScsiFake = true; }
TFakeScsi::~TFakeScsi() { gIsScsiFake = false; }

TFastSelect::TFastSelect() { gFastSelect = this; }
TFastSelect::~TFastSelect() { gFastSelect = nullptr; }

}  // namespace NQRVZEP20
