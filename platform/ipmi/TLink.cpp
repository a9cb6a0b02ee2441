// SPDX-License-Identifier: Apache-2.0
#include "platform/ipmi/TLink.h"

#include "platform/include/ipmiClient.h"
#include "platform/ipmi/Failure.h"

#include <errno.h>
#include <netdb.h>
#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <memory>
#include <new>

namespace ipmi {
namespace {

// An answer of 256 bytes is well below this, including everything around it.
constexpr std::size_t kLongestPacket = 2048;

bool IsPort(std::string const& port) {
  bool const isNumber = !port.empty() && port.size() <= 5 && port.find_first_not_of("0123456789") == std::string::npos;
  return isNumber && std::stoi(port) >= 1 && std::stoi(port) <= 65535;
}

std::string WithoutBrackets(std::string const& host) {
  bool const hasBrackets = host.size() > 2 && host.front() == '[' && host.back() == ']';
  return hasBrackets ? host.substr(1, host.size() - 2) : host;
}

// A socket that reports the errors with which other hosts answer packets that they refuse.
int UnconnectedSocket(int family) {
  int const socket = ::socket(family, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
  if (socket < 0 && (errno == ENOMEM || errno == ENOBUFS)) throw std::bad_alloc();
  if (socket < 0) throw TFailure{kIpmiClientUnreachable};
  int const isOn = 1;
  if (family == AF_INET6)
    ::setsockopt(socket, IPPROTO_IPV6, IPV6_RECVERR, &isOn, sizeof isOn);
  else
    ::setsockopt(socket, IPPROTO_IP, IP_RECVERR, &isOn, sizeof isOn);
  return socket;
}

int MillisecondsUntil(TClock::time_point until) {
  auto const left = std::chrono::ceil<std::chrono::milliseconds>(until - TClock::now()).count();
  return static_cast<int>(std::max<decltype(left)>(left, 0));
}

}  // namespace

std::vector<TAddress> AddressesOf(std::string const& host, std::string const& port) {
  if (!IsPort(port)) throw TFailure{kIpmiClientBadArgument};
  addrinfo hints{};
  hints.ai_socktype = SOCK_DGRAM;
  hints.ai_flags = AI_NUMERICSERV;
  addrinfo* first = nullptr;
  int const error = ::getaddrinfo(WithoutBrackets(host).c_str(), port.c_str(), &hints, &first);
  if (error == EAI_MEMORY) throw std::bad_alloc();
  if (error != 0) throw TFailure{kIpmiClientHostUnknown};
  std::unique_ptr<addrinfo, decltype(&::freeaddrinfo)> const list(first, ::freeaddrinfo);

  std::vector<TAddress> addresses;
  for (addrinfo const* entry = first; entry != nullptr; entry = entry->ai_next) {
    TAddress& address = addresses.emplace_back();
    address.fSize = entry->ai_addrlen;
    std::memcpy(&address.fAddress, entry->ai_addr, entry->ai_addrlen);
  }
  return addresses;
}

TLink::TLink(TAddress const& address) : fAddress(address), fSocket(UnconnectedSocket(address.fAddress.ss_family)) {}

void TLink::Send(TPacket const& packet) {
  // A refusal of an earlier packet is reported by the next call, which then does nothing else: hence the second one.
  for (int attempt = 0; attempt < 2; ++attempt) {
    auto const* const address = reinterpret_cast<sockaddr const*>(&fAddress.fAddress);
    if (::sendto(fSocket.get(), packet.data(), packet.size(), MSG_NOSIGNAL, address, fAddress.fSize) >= 0) return;
    if (errno == ECONNREFUSED) fIsRefused = true;
  }
  bool const isLost = errno == ECONNREFUSED || errno == ENOBUFS || errno == EAGAIN || errno == EINTR;
  if (!isLost) throw TFailure{kIpmiClientUnreachable};
}

std::optional<TPacket> TLink::Receive(TClock::time_point until) {
  TPacket packet(kLongestPacket);
  while (TClock::now() < until && !NobodyListens()) {
    pollfd waiting = {fSocket.get(), POLLIN, 0};
    if (::poll(&waiting, 1, MillisecondsUntil(until)) <= 0) continue;
    if ((waiting.revents & POLLERR) != 0) TakeErrors();
    ssize_t const size = ::recv(fSocket.get(), packet.data(), packet.size(), MSG_TRUNC);
    if (size < 0) continue;
    fHasReceived = true;
    bool const isWhole = static_cast<std::size_t>(size) <= packet.size();
    packet.resize(isWhole ? static_cast<std::size_t>(size) : 0);
    return packet;
  }
  return std::nullopt;
}

void TLink::TakeErrors() {
  int error = 0;
  socklen_t size = sizeof error;
  if (::getsockopt(fSocket.get(), SOL_SOCKET, SO_ERROR, &error, &size) == 0 && error == ECONNREFUSED) fIsRefused = true;
  // The errors are in a queue of their own, each with the packet that caused it.
  char packet[kLongestPacket];
  while (::recv(fSocket.get(), packet, sizeof packet, MSG_ERRQUEUE) >= 0) {
  }
}

void Exchange(TLink& link, TExchange const& exchange, TWaits const& waits, TClock::time_point deadline) {
  bool hasNonsense = false;
  for (auto const wait : waits) {
    if (TClock::now() >= deadline || link.NobodyListens()) break;
    link.Send(exchange.fRequest());
    TClock::time_point const until = std::min(TClock::now() + wait, deadline);
    while (auto const packet = link.Receive(until)) {
      EVerdict const verdict = exchange.fJudge(*packet);
      if (verdict == EVerdict::kAnswer) return;
      hasNonsense = hasNonsense || verdict == EVerdict::kNonsense;
    }
  }
  throw TFailure{hasNonsense ? kIpmiClientFail : kIpmiClientNoAnswer};
}

}  // namespace ipmi
