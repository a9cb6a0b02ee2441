// SPDX-License-Identifier: Apache-2.0

// Runs the discovery, or the step that ends DHCP clients, and prints what came of it: the URL, how long it took, and what
// was logged.
//
//   WpadProbe start|stop
//
// Only inside of run-in-netns.sh: it ends every DHCP client that it sees. With ZEP_WPAD_HURRY set it waits a twentieth of
// every time that the library waits, and says how long that would have been. With ZEP_WPAD_FAIL=0x8915 that request of the
// interfaces fails for the interface "eth0"; with ZEP_WPAD_NO_DESCRIPTORS there are no descriptors left.

#include "AutoProxyDiscovery.h"
#include "tests/Support.h"

#include <dlfcn.h>
#include <net/if.h>
#include <sys/ioctl.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/time.h>
#include <unistd.h>

#include <chrono>
#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <iostream>

namespace {

constexpr long kHurry = 8;

bool IsInHurry() { return ::getenv("ZEP_WPAD_HURRY") != nullptr; }

void SayWaited(long seconds) {
  NQRVZEP20::TLogger::GetInstance()->OutputLogEntry(NQRVZEP20::ILogger::kLogDebug, "(up to " + std::to_string(seconds) + " s)");
}

void LimitDescriptors(rlim_t most) {
  rlimit limit{};
  ::getrlimit(RLIMIT_NOFILE, &limit);
  limit.rlim_cur = most;
  ::setrlimit(RLIMIT_NOFILE, &limit);
}

}  // namespace

// These are found by the library before those of the C library.

extern "C" ZEP_EXPORT int setsockopt(int socket, int level, int option, void const* value, socklen_t size) noexcept {
  static auto* const next = reinterpret_cast<decltype(&setsockopt)>(::dlsym(RTLD_NEXT, "setsockopt"));
  if (!IsInHurry() || level != SOL_SOCKET || option != SO_RCVTIMEO) return next(socket, level, option, value, size);
  timeval limit{};
  std::memcpy(&limit, value, sizeof limit);
  SayWaited(limit.tv_sec);
  limit = {0, limit.tv_sec * 1000000 / kHurry};
  return next(socket, level, option, &limit, sizeof limit);
}

extern "C" ZEP_EXPORT unsigned sleep(unsigned seconds) {
  if (IsInHurry()) SayWaited(seconds);
  ::usleep(seconds * 1000000 / (IsInHurry() ? kHurry : 1));
  return 0;
}

extern "C" ZEP_EXPORT int ioctl(int fd, unsigned long request, ...) noexcept {
  static auto* const next = reinterpret_cast<decltype(&ioctl)>(::dlsym(RTLD_NEXT, "ioctl"));
  va_list arguments;
  va_start(arguments, request);
  void* const argument = va_arg(arguments, void*);
  va_end(arguments);
  char const* const failing = ::getenv("ZEP_WPAD_FAIL");
  bool const isAsked = failing != nullptr && std::strtoul(failing, nullptr, 16) == request;
  bool const isIt = request == SIOCGIFCONF || std::string(static_cast<ifreq const*>(argument)->ifr_name) == "eth0";
  return isAsked && isIt ? -1 : next(fd, request, argument);
}

int main(int argc, char** argv) {
  if (::getenv("ZEP_WPAD_INSIDE") == nullptr || argc != 2) {
    std::cerr << "WpadProbe: only for run-in-netns.sh\n";
    return 64;
  }
  std::vector<std::string> log;
  std::string url;
  long milliseconds = 0;
  {
    NQRVZEP20::TLogCapture const capture;
    if (::getenv("ZEP_WPAD_NO_DESCRIPTORS") != nullptr) LimitDescriptors(0);
    auto const start = std::chrono::steady_clock::now();
    if (std::string(argv[1]) == "start")
      url = AutoProxyDiscovery::StartWpad();
    else
      AutoProxyDiscovery::wpadPreconfig();
    milliseconds = std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::steady_clock::now() - start).count();
    LimitDescriptors(256);
    log = capture.Entries();
  }
  std::cout << url << "\n" << milliseconds << "\n";
  for (std::string const& entry : log) std::cout << entry << "\n";
  return 0;
}
