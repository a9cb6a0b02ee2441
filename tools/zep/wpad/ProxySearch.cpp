// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/wpad/ProxySearch.h"

#include "AutoProxyDiscovery.h"
#include "core/Handles.h"
#include "proxy/WpadQuery.h"

#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>
#include <netinet/in.h>
#include <netpacket/packet.h>
#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

using TClock = std::chrono::steady_clock;

// Tries to listen on the port now; 0 or the error.
int ErrorOfListening() {
  TUniqueFd const socket(::socket(AF_INET, SOCK_DGRAM, 0));
  sockaddr_in name{};
  name.sin_family = AF_INET;
  name.sin_port = htons(kDhcpClientPort);
  return ::bind(socket.get(), reinterpret_cast<sockaddr const*>(&name), sizeof name) == 0 ? 0 : errno;
}

bool IsBound(int socket) {
  sockaddr_in name{};
  socklen_t size = sizeof name;
  return ::getsockname(socket, reinterpret_cast<sockaddr*>(&name), &size) == 0 && name.sin_port != 0;
}

// ---- Interfaces ----

using TAddresses = std::unique_ptr<ifaddrs, void (*)(ifaddrs*)>;

TAddresses AllAddresses() {
  ifaddrs* first = nullptr;
  if (::getifaddrs(&first) != 0) first = nullptr;
  return {first, ::freeifaddrs};
}

std::string TextOf(in_addr const& address) {
  char text[INET_ADDRSTRLEN] = "";
  ::inet_ntop(AF_INET, &address, text, sizeof text);
  return text;
}

// The first IPv4 address of an interface; empty when it has none.
std::string AddressOf(ifaddrs const* all, std::string const& name) {
  for (ifaddrs const* entry = all; entry != nullptr; entry = entry->ifa_next) {
    if (entry->ifa_addr == nullptr || entry->ifa_addr->sa_family != AF_INET || entry->ifa_name != name) continue;
    return TextOf(reinterpret_cast<sockaddr_in const*>(entry->ifa_addr)->sin_addr);
  }
  return "";
}

std::string HardwareAddressIn(ifaddrs const& link) {
  unsigned char const* const bytes = reinterpret_cast<sockaddr_ll const*>(link.ifa_addr)->sll_addr;
  char text[18];
  std::snprintf(text, sizeof text, "%02x:%02x:%02x:%02x:%02x:%02x", bytes[0], bytes[1], bytes[2], bytes[3], bytes[4], bytes[5]);
  return text;
}

std::vector<TQuery> EthernetInterfaces() {
  std::vector<TQuery> interfaces;
  TAddresses const all = AllAddresses();
  for (ifaddrs const* link = all.get(); link != nullptr; link = link->ifa_next) {
    std::string const name = link->ifa_name;
    if (link->ifa_addr == nullptr || link->ifa_addr->sa_family != AF_PACKET || name.rfind("eth", 0) != 0) continue;
    TQuery query;
    query.fInterface = name;
    query.fIsUp = (link->ifa_flags & IFF_UP) != 0;
    query.fIsPromiscuous = (link->ifa_flags & IFF_PROMISC) != 0;
    query.fAddress = AddressOf(all.get(), name);
    query.fHardwareAddress = HardwareAddressIn(*link);
    if (query.fAddress.empty()) query.fFailure = "it has no IPv4 address";
    interfaces.push_back(query);
  }
  return interfaces;
}

// ---- The query ----

// Whether a reply arrived within the seconds of one attempt.
bool WaitForReply(int receiver, TQuery const& query, int attempt, TOnWait const& onWait) {
  for (int second = 0; second < kWpadReplySeconds; ++second) {
    onWait(query, (kWpadAttempts - attempt + 1) * kWpadReplySeconds - second);
    pollfd watched{receiver, POLLIN, 0};
    if (::poll(&watched, 1, 1000) > 0) return true;
  }
  return false;
}

// The URL as text: some servers append a zero byte or a newline.
std::string WithoutEnd(std::string const& url) {
  std::string const text = url.substr(0, url.find('\0'));
  return text.substr(0, text.find_last_not_of(" \r\n") + 1);
}

void Receive(int receiver, TQuery& query, TClock::time_point sent) {
  std::array<unsigned char, AutoProxyDiscovery::kMessageSize> bytes{};
  sockaddr_in sender{};
  socklen_t size = sizeof sender;
  ssize_t const count = ::recvfrom(receiver, bytes.data(), bytes.size(), 0, reinterpret_cast<sockaddr*>(&sender), &size);
  if (count < 0) {
    query.fFailure = std::string("receiving failed: ") + std::strerror(errno);
    return;
  }
  auto const time = std::chrono::duration_cast<std::chrono::milliseconds>(TClock::now() - sent);
  query.fReply = TReply{static_cast<std::size_t>(count), TextOf(sender.sin_addr), static_cast<long>(time.count())};
  query.fUrl = WithoutEnd(AutoProxyDiscovery::dhcp_parser(bytes.data() + AutoProxyDiscovery::kOptionsOffset));
}

// After a message that could not be sent, no reply is waited for.
void SendAndReceive(int sender, int receiver, TQuery& query, TOnWait const& onWait) {
  std::unique_ptr<unsigned char, void (*)(void*)> const message(
      AutoProxyDiscovery::make_message(query.fAddress, query.fHardwareAddress), std::free);
  for (int attempt = 1; attempt <= kWpadAttempts && message != nullptr; ++attempt) {
    auto const start = TClock::now();
    if (AutoProxyDiscovery::send_packet(sender, message.get(), AutoProxyDiscovery::kMessageSize) < 0) {
      query.fFailure = std::string("sending failed: ") + std::strerror(errno);
      continue;
    }
    ++query.fSent;
    query.fFailure.clear();
    if (WaitForReply(receiver, query, attempt, onWait)) return Receive(receiver, query, start);
  }
}

// False when no other query can succeed either.
bool Ask(TQuery& query, TOnWait const& onWait) {
  TUniqueFd const sender(AutoProxyDiscovery::open_send_socket());
  TUniqueFd const receiver(AutoProxyDiscovery::open_recv_socket(query.fInterface.data()));
  if (!sender || !receiver)
    query.fFailure = "no socket could be opened";
  else if (!IsBound(receiver.get()))
    query.fFailure = "another program is using port 68";
  else {
    SendAndReceive(sender.get(), receiver.get(), query, onWait);
    return true;
  }
  return false;
}

// Sends the query and adds it to the search; false when the search is over.
bool Include(TQuery query, TSearch& search, TOnWait const& onWait) {
  bool const goesOn = !query.fFailure.empty() || Ask(query, onWait);
  if (!goesOn) search.fFailure = query.fFailure;
  search.fUrl = query.fUrl;
  search.fQueries.push_back(std::move(query));
  return goesOn && search.fUrl.empty();
}

}  // namespace

std::string WhyNoListening() {
  int const error = ErrorOfListening();
  if (error == EACCES || error == EPERM) return "zep wpad must be run as root: only root may listen on port 68";
  return error == 0 || error == EADDRINUSE ? "" : std::string("cannot listen on port 68: ") + std::strerror(error);
}

bool IsPortTaken() { return ErrorOfListening() == EADDRINUSE; }

TSearch SearchProxy(TOnWait const& onWait) {
  TSearch search;
  TQuery last;
  for (TQuery const& interface : EthernetInterfaces()) {
    if (!Include(interface, search, onWait)) return search;
    if (!interface.fAddress.empty()) last.fHardwareAddress = interface.fHardwareAddress;  // as in the library
  }
  last.fAddress = ShownIPV6Address();
  if (!last.fAddress.empty()) Include(last, search, onWait);
  return search;
}

}  // namespace NQRVZEP20::zep
