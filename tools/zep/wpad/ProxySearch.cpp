// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/wpad/ProxySearch.h"

#include "AutoProxyDiscovery.h"
#include "TOSSpecific.h"
#include "TZEPException.h"
#include "tools/zep/processes/Descriptor.h"

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

constexpr int kAttempts = 3;
constexpr int kClientPort = 68;

using TClock = std::chrono::steady_clock;

// 0, or the error of listening on the port right now.
int ErrorOfListening() {
  TDescriptor const socket(::socket(AF_INET, SOCK_DGRAM, 0));
  sockaddr_in name{};
  name.sin_family = AF_INET;
  name.sin_port = htons(kClientPort);
  return ::bind(socket.Get(), reinterpret_cast<sockaddr const*>(&name), sizeof name) == 0 ? 0 : errno;
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

std::vector<TAsking> EthernetInterfaces() {
  std::vector<TAsking> interfaces;
  TAddresses const all = AllAddresses();
  for (ifaddrs const* link = all.get(); link != nullptr; link = link->ifa_next) {
    std::string const name = link->ifa_name;
    if (link->ifa_addr == nullptr || link->ifa_addr->sa_family != AF_PACKET || name.rfind("eth", 0) != 0) continue;
    TAsking asking;
    asking.fInterface = name;
    asking.fIsUp = (link->ifa_flags & IFF_UP) != 0;
    asking.fIsPromiscuous = (link->ifa_flags & IFF_PROMISC) != 0;
    asking.fAddress = AddressOf(all.get(), name);
    asking.fHardwareAddress = HardwareAddressIn(*link);
    if (asking.fAddress.empty()) asking.fFailure = "it has no IPv4 address";
    interfaces.push_back(asking);
  }
  return interfaces;
}

// The address that "ifconfig" shows behind "inet6 addr: "; empty when it shows none in this form.
std::string ShownIPV6Address() {
  std::string const label = "inet6 addr: ";
  std::string shown;
  try {
    shown = TOSSpecific::SpawnProcess("ifconfig", {}, 300);
  } catch (TZEPException const&) {
    return "";
  }
  std::size_t const found = shown.find(label);
  if (found == std::string::npos) return "";
  std::size_t const start = found + label.size();
  return shown.substr(start, shown.find_first_of("/ \t\r\n", start) - start);
}

// ---- Asking ----

// Whether something came within the seconds of one attempt.
bool WaitForReply(int receiver, TAsking const& asking, int attempt, TOnWait const& onWait) {
  for (int second = 0; second < kReplySeconds; ++second) {
    onWait(asking, (kAttempts - attempt + 1) * kReplySeconds - second);
    pollfd watched{receiver, POLLIN, 0};
    if (::poll(&watched, 1, 1000) > 0) return true;
  }
  return false;
}

// The URL as text: some servers end it with a zero byte or a newline.
std::string WithoutEnd(std::string const& url) {
  std::string const text = url.substr(0, url.find('\0'));
  return text.substr(0, text.find_last_not_of(" \r\n") + 1);
}

void Receive(int receiver, TAsking& asking, TClock::time_point sent) {
  std::array<unsigned char, AutoProxyDiscovery::kMessageSize> bytes{};
  sockaddr_in sender{};
  socklen_t size = sizeof sender;
  ssize_t const count = ::recvfrom(receiver, bytes.data(), bytes.size(), 0, reinterpret_cast<sockaddr*>(&sender), &size);
  if (count < 0) {
    asking.fFailure = std::string("receiving failed: ") + std::strerror(errno);
    return;
  }
  auto const time = std::chrono::duration_cast<std::chrono::milliseconds>(TClock::now() - sent);
  asking.fReply = TReply{static_cast<std::size_t>(count), TextOf(sender.sin_addr), static_cast<long>(time.count())};
  asking.fUrl = WithoutEnd(AutoProxyDiscovery::dhcp_parser(bytes.data() + AutoProxyDiscovery::kOptionsOffset));
}

// A message that could not be sent is not waited for.
void SendAndReceive(int sender, int receiver, TAsking& asking, TOnWait const& onWait) {
  std::unique_ptr<unsigned char, void (*)(void*)> const message(
      AutoProxyDiscovery::make_message(asking.fAddress, asking.fHardwareAddress), std::free);
  for (int attempt = 1; attempt <= kAttempts && message != nullptr; ++attempt) {
    auto const start = TClock::now();
    if (AutoProxyDiscovery::send_packet(sender, message.get(), AutoProxyDiscovery::kMessageSize) < 0) {
      asking.fFailure = std::string("sending failed: ") + std::strerror(errno);
      continue;
    }
    ++asking.fSent;
    asking.fFailure.clear();
    if (WaitForReply(receiver, asking, attempt, onWait)) return Receive(receiver, asking, start);
  }
}

// False when no other asking can do better.
bool Ask(TAsking& asking, TOnWait const& onWait) {
  TDescriptor const sender(AutoProxyDiscovery::open_send_socket());
  TDescriptor const receiver(AutoProxyDiscovery::open_recv_socket(asking.fInterface.data()));
  if (!sender || !receiver)
    asking.fFailure = "there is no socket";
  else if (!IsBound(receiver.Get()))
    asking.fFailure = "another program holds port 68";
  else {
    SendAndReceive(sender.Get(), receiver.Get(), asking, onWait);
    return true;
  }
  return false;
}

// Adds the asking to the search; false when the search is over.
bool Include(TAsking asking, TSearch& search, TOnWait const& onWait) {
  bool const goesOn = !asking.fFailure.empty() || Ask(asking, onWait);
  if (!goesOn) search.fFailure = asking.fFailure;
  search.fUrl = asking.fUrl;
  search.fAskings.push_back(std::move(asking));
  return goesOn && search.fUrl.empty();
}

}  // namespace

std::string WhyNoListening() {
  int const error = ErrorOfListening();
  if (error == EACCES || error == EPERM) return "zep wpad needs root: nobody else may listen on port 68";
  return error == 0 || error == EADDRINUSE ? "" : std::string("port 68 cannot be listened on: ") + std::strerror(error);
}

bool IsPortTaken() { return ErrorOfListening() == EADDRINUSE; }

TSearch SearchProxy(TOnWait const& onWait) {
  TSearch search;
  TAsking last;
  for (TAsking const& interface : EthernetInterfaces()) {
    if (!Include(interface, search, onWait)) return search;
    if (!interface.fAddress.empty()) last.fHardwareAddress = interface.fHardwareAddress;  // as the library has it
  }
  last.fAddress = ShownIPV6Address();
  if (!last.fAddress.empty()) Include(last, search, onWait);
  return search;
}

}  // namespace NQRVZEP20::zep
