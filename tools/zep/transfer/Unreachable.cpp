// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Unreachable.h"

#include "core/Handles.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/processes/TChildProcess.h"

#include <netdb.h>
#include <poll.h>
#include <signal.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdint>
#include <memory>
#include <system_error>

namespace NQRVZEP20::zep {

namespace {

using TAddresses = std::unique_ptr<addrinfo, void (*)(addrinfo*)>;

// "[::1]" without its brackets.
std::string WithoutBrackets(std::string const& host) {
  bool const isBracketed = host.size() > 2 && host.front() == '[' && host.back() == ']';
  return isBracketed ? host.substr(1, host.size() - 2) : host;
}

// Returns 0 or an error of getaddrinfo.
int Resolve(std::string const& host, std::string const& port, TAddresses& addresses) {
  addrinfo wanted{}, *found = nullptr;
  wanted.ai_socktype = SOCK_STREAM;
  int const error = ::getaddrinfo(WithoutBrackets(host).c_str(), port.c_str(), &wanted, &found);
  if (error == 0) addresses.reset(found);
  return error;
}

// Waits until the connection attempt has ended. Returns 0, ETIMEDOUT or another errno. A signal does not shorten the wait.
int WaitForConnection(int socket, int timeoutSeconds) {
  using TClock = std::chrono::steady_clock;
  TClock::time_point const end = TClock::now() + std::chrono::seconds(timeoutSeconds);
  pollfd waiting{socket, POLLOUT, 0};
  while (true) {
    auto const left = std::chrono::ceil<std::chrono::milliseconds>(end - TClock::now()).count();
    int const ready = ::poll(&waiting, 1, static_cast<int>(std::max<std::int64_t>(left, 0)));
    if (ready > 0) return 0;
    if (ready == 0) return ETIMEDOUT;
    if (errno != EINTR) return errno;
  }
}

// Tries to connect. Returns 0 or errno.
int ErrorOfConnecting(addrinfo const& address, int timeoutSeconds) {
  TUniqueFd const socket(::socket(address.ai_family, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
  if (!socket) return errno;
  if (::connect(socket.get(), address.ai_addr, address.ai_addrlen) == 0) return 0;
  if (errno != EINPROGRESS) return errno;
  int error = WaitForConnection(socket.get(), timeoutSeconds);
  if (error != 0) return error;
  socklen_t size = sizeof error;
  return ::getsockopt(socket.get(), SOL_SOCKET, SO_ERROR, &error, &size) == 0 ? error : errno;
}

std::string ReasonOf(int error, std::string const& host, std::string const& port) {
  if (error == ECONNREFUSED)
    return host + " refuses connections to port " + port + "; is the server running, and the port right?";
  if (error == ETIMEDOUT)
    return host + " does not answer at port " + port + "; is it on, and does a firewall let this port through?";
  return host + ", port " + port + ": " + std::generic_category().message(error);
}

std::string ResultOfProbe(std::string const& host, std::string const& port, int timeoutSeconds) {
  TAddresses addresses(nullptr, ::freeaddrinfo);
  int const unknown = Resolve(host, port, addresses);
  if (unknown == EAI_AGAIN) return "the host name " + host + " could not be looked up: no name server answers";
  if (unknown != 0) return "the host name " + host + " has no address; is it spelled right? (" + ::gai_strerror(unknown) + ")";
  int error = 0;
  for (addrinfo const* address = addresses.get(); address != nullptr; address = address->ai_next) {
    error = ErrorOfConnecting(*address, timeoutSeconds);
    if (error == 0) return "";
  }
  return ReasonOf(error, host, port);
}

}  // namespace

// Uses a child process, which can be killed: a name look-up continues after a signal.
std::string WhyUnreachable(std::string const& host, std::string const& port, int timeoutSeconds) {
  constexpr int kLookEveryMilliseconds = 100;
  TChildProcess child([&] { return ResultOfProbe(host, port, timeoutSeconds); }, SIGKILL);
  std::string why;
  pollfd waiting{child.Output(), POLLIN, 0};
  while (PendingInterrupt() == 0)
    if (::poll(&waiting, 1, kLookEveryMilliseconds) > 0 && !child.Read(why)) return why;
  return "interrupted";
}

}  // namespace NQRVZEP20::zep
