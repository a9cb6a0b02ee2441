// SPDX-License-Identifier: Apache-2.0
#include "platform/usblan/Interfaces.h"

#include "core/Handles.h"

#include <errno.h>
#include <ifaddrs.h>
#include <linux/rtnetlink.h>
#include <net/if.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <map>
#include <memory>
#include <sstream>
#include <system_error>

namespace usblan {
namespace {

using NQRVZEP20::TUniqueFd;

constexpr std::uint32_t AddressOf(int a, int b, int c, int d) {
  return static_cast<std::uint32_t>(a) << 24 | static_cast<std::uint32_t>(b) << 16 | static_cast<std::uint32_t>(c) << 8 |
         static_cast<std::uint32_t>(d);
}

constexpr int kFirstThirdOctet = 95;  // of node 0

[[noreturn]] void ThrowSystemError(int error) { throw std::system_error(error, std::system_category()); }

TUniqueFd OpenSocket(int domain, int type, int protocol) {
  TUniqueFd socket(::socket(domain, type | SOCK_CLOEXEC, protocol));
  if (!socket) ThrowSystemError(errno);
  return socket;
}

std::uint32_t NumberOf(sockaddr const* address) {
  sockaddr_in version4;
  std::memcpy(&version4, address, sizeof version4);
  return ntohl(version4.sin_addr.s_addr);
}

bool IsLinkLocal(TAddress const& address) { return address.fAddress >> 16 == AddressOf(169, 254, 0, 0) >> 16; }

bool IsController(std::vector<TInterface>::value_type const& interface, std::string const& classNet) {
  return IsUsbNetwork(classNet, interface.fName) &&
         std::all_of(interface.fAddresses.begin(), interface.fAddresses.end(), IsLinkLocal);
}

TInterface InterfaceNamed(std::string const& name, std::vector<TInterface> const& all) {
  auto const found = std::find_if(all.begin(), all.end(), [&](TInterface const& interface) { return interface.fName == name; });
  return found != all.end() ? *found : TInterface{name, false, {}, false};
}

// A missing interface keeps its place, so that the others keep their nodes.
std::vector<TInterface> Named(std::vector<TInterface> const& all, std::string const& names) {
  std::vector<TInterface> named;
  std::istringstream words(names);
  for (std::string name; words >> name;) named.push_back(InterfaceNamed(name, all));
  return named;
}

// The request to add an address, in the form of the kernel's route socket.
struct TNewAddress {
  nlmsghdr fHeader;
  ifaddrmsg fMessage;
  struct {
    rtattr fHead;
    std::uint32_t fAddress;  // in network byte order
  } fLocal, fOwn;
};

TNewAddress NewAddress(unsigned interface, std::uint32_t address) {
  TNewAddress request{};
  request.fHeader.nlmsg_len = sizeof request;
  request.fHeader.nlmsg_type = RTM_NEWADDR;
  request.fHeader.nlmsg_flags = NLM_F_REQUEST | NLM_F_ACK | NLM_F_CREATE | NLM_F_EXCL;
  request.fMessage.ifa_family = AF_INET;
  request.fMessage.ifa_prefixlen = kPrefixLength;
  request.fMessage.ifa_scope = RT_SCOPE_LINK;
  request.fMessage.ifa_index = interface;
  request.fLocal = {{sizeof request.fLocal, IFA_LOCAL}, htonl(address)};
  request.fOwn = {{sizeof request.fOwn, IFA_ADDRESS}, htonl(address)};
  return request;
}

// The kernel's result for a request that it has to acknowledge: 0 or an errno value.
int AcknowledgedError(int socket) {
  struct {
    nlmsghdr fHeader;
    nlmsgerr fError;
    char fRest[512];
  } answer{};
  if (::recv(socket, &answer, sizeof answer, 0) < 0) return errno;
  return answer.fHeader.nlmsg_type == NLMSG_ERROR ? -answer.fError.error : EPROTO;
}

}  // namespace

std::uint32_t ControllerAddress(int node) { return AddressOf(169, 254, kFirstThirdOctet + node, 118); }

std::uint32_t OwnAddress(int node) { return AddressOf(169, 254, kFirstThirdOctet + node, 1); }

std::vector<TInterface> AllInterfaces() {
  ifaddrs* first = nullptr;
  if (::getifaddrs(&first) != 0) ThrowSystemError(errno);
  std::unique_ptr<ifaddrs, decltype(&::freeifaddrs)> const list(first, ::freeifaddrs);
  std::map<std::string, TInterface> byName;
  for (ifaddrs const* entry = first; entry != nullptr; entry = entry->ifa_next) {
    std::string const name = entry->ifa_name;
    TInterface& interface = byName[name.substr(0, name.find(':'))];  // without the label of the address
    interface.fName = name.substr(0, name.find(':'));
    interface.fIsUp = (entry->ifa_flags & IFF_UP) != 0;
    if (entry->ifa_addr != nullptr && entry->ifa_addr->sa_family == AF_INET && entry->ifa_netmask != nullptr)
      interface.fAddresses.push_back({NumberOf(entry->ifa_addr), NumberOf(entry->ifa_netmask)});
  }
  std::vector<TInterface> all;
  for (auto& [name, interface] : byName) all.push_back(std::move(interface));
  return all;
}

bool IsUsbNetwork(std::string const& classNet, std::string const& name) {
  std::error_code error;
  std::string const driver = std::filesystem::read_symlink(classNet + "/" + name + "/device/driver", error).filename().string();
  return !error && (driver == "cdc_ether" || driver == "cdc_subset" || driver == "rndis_host");
}

std::vector<TInterface> ControllerInterfaces(std::vector<TInterface> const& all, std::string const& named,
                                             std::string const& classNet) {
  std::vector<TInterface> found;
  if (!named.empty())
    found = Named(all, named);
  else
    std::copy_if(all.begin(), all.end(), std::back_inserter(found),
                 [&](TInterface const& interface) { return IsController(interface, classNet); });
  found.resize(std::min<std::size_t>(found.size(), kMaxNodes));
  return found;
}

bool Reaches(TInterface const& interface, int node) {
  std::uint32_t const controller = ControllerAddress(node);
  auto const reaches = [controller](TAddress const& own) {
    return own.fAddress != controller && (own.fAddress & own.fMask) == (controller & own.fMask) && own.fMask != 0;
  };
  return interface.fIsUp && std::any_of(interface.fAddresses.begin(), interface.fAddresses.end(), reaches);
}

void AddOwnAddress(TInterface const& interface, int node) {
  unsigned const index = ::if_nametoindex(interface.fName.c_str());
  if (index == 0) ThrowSystemError(ENODEV);
  TUniqueFd const socket = OpenSocket(AF_NETLINK, SOCK_RAW, NETLINK_ROUTE);
  TNewAddress const request = NewAddress(index, OwnAddress(node));
  if (::send(socket.get(), &request, sizeof request, 0) < 0) ThrowSystemError(errno);
  int const error = AcknowledgedError(socket.get());
  if (error != 0 && error != EEXIST) ThrowSystemError(error);
}

void TakeUp(TInterface const& interface) {
  TUniqueFd const socket = OpenSocket(AF_INET, SOCK_DGRAM, 0);
  ifreq request{};
  interface.fName.copy(request.ifr_name, IFNAMSIZ - 1);
  if (::ioctl(socket.get(), SIOCGIFFLAGS, &request) != 0) ThrowSystemError(errno);
  request.ifr_flags = static_cast<short>(request.ifr_flags | IFF_UP);
  if (::ioctl(socket.get(), SIOCSIFFLAGS, &request) != 0) ThrowSystemError(errno);
}

}  // namespace usblan
