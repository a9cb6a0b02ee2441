// SPDX-License-Identifier: Apache-2.0
#include "NetlinkDump.h"

#include "NetlinkMessages.h"

#include <libmnl/libmnl.h>
#include <linux/rtnetlink.h>
#include <sys/time.h>

#include <cerrno>
#include <memory>

namespace NQRVZEP20 {

namespace {

constexpr int kAttempts = 3;
constexpr std::size_t kDatagramLimit = 64 << 10;  // the kernel sends at most 32 KiB at a time

using TSocket = std::unique_ptr<mnl_socket, int (*)(mnl_socket*)>;

TMissing WhyRefused(char const* action, int error) {
  return {error == EPERM || error == EACCES ? kMissingNeedsRoot : kMissingUnreadable,
          std::string("netlink: ") + action + ": " + std::strerror(error)};
}

// A kernel that checks requests strictly sends only the routes of the table that the request names.
TFinding<TSocket*> Prepare(TSocket& socket) {
  if (!socket) return WhyRefused("the kernel refuses the socket", errno);
  int isStrict = 1;
  mnl_socket_setsockopt(socket.get(), NETLINK_GET_STRICT_CHK, &isStrict, sizeof isStrict);  // kernels before 4.20 lack it
  timeval const second{1, 0};
  ::setsockopt(mnl_socket_get_fd(socket.get()), SOL_SOCKET, SO_RCVTIMEO, &second, sizeof second);
  if (mnl_socket_bind(socket.get(), 0, MNL_SOCKET_AUTOPID) < 0) return WhyRefused("the kernel refuses the address", errno);
  return &socket;
}

TFinding<TSocket*> Send(TSocket& socket, int request, unsigned char family) {
  alignas(nlmsghdr) char buffer[NLMSG_SPACE(sizeof(ifinfomsg)) + NLMSG_SPACE(sizeof(std::uint32_t))] = {};
  nlmsghdr* const message = mnl_nlmsg_put_header(buffer);
  message->nlmsg_type = static_cast<std::uint16_t>(request);
  message->nlmsg_flags = NLM_F_REQUEST | NLM_F_DUMP;
  if (request == RTM_GETLINK) {
    static_cast<ifinfomsg*>(mnl_nlmsg_put_extra_header(message, sizeof(ifinfomsg)))->ifi_family = family;
  } else if (request == RTM_GETADDR) {
    static_cast<ifaddrmsg*>(mnl_nlmsg_put_extra_header(message, sizeof(ifaddrmsg)))->ifa_family = family;
  } else {
    auto* const route = static_cast<rtmsg*>(mnl_nlmsg_put_extra_header(message, sizeof(rtmsg)));
    route->rtm_family = family;
    route->rtm_table = RT_TABLE_MAIN;
  }
  if (mnl_socket_sendto(socket.get(), message, message->nlmsg_len) < 0) return WhyRefused("the request is refused", errno);
  return &socket;
}

bool HasEnd(std::string const& datagram) {
  bool hasEnd = false;
  VisitPayloads(datagram, [&](unsigned type, std::string_view) { hasEnd |= type == NLMSG_DONE || type == NLMSG_ERROR; });
  return hasEnd;
}

TFinding<std::string> Receive(TSocket& socket, std::size_t limit) {
  std::string dump, datagram;
  while (dump.size() < limit) {
    datagram.resize(kDatagramLimit);
    ssize_t const size = mnl_socket_recvfrom(socket.get(), datagram.data(), datagram.size());
    if (size < 0 && errno == EINTR) continue;
    if (size < 0) return WhyRefused("no answer", errno);
    datagram.resize(static_cast<std::size_t>(size));
    dump += datagram;
    if (HasEnd(datagram)) break;
  }
  TFinding<int> const error = ErrorIn(dump);
  if (error) return WhyRefused("the kernel answers", *error);
  return dump;
}

TFinding<std::string> DumpOnce(int request, unsigned char family, std::size_t limit) {
  TSocket socket(mnl_socket_open2(NETLINK_ROUTE, SOCK_CLOEXEC), mnl_socket_close);
  return Prepare(socket).Then([&](TSocket* prepared) { return Send(*prepared, request, family); }).Then([&](TSocket* asked) {
    return Receive(*asked, limit);
  });
}

}  // namespace

TFinding<std::string> NetlinkDump(int request, unsigned char family, std::size_t limit) {
  TFinding<std::string> dump = DumpOnce(request, family, limit);
  for (int attempt = 1; attempt < kAttempts && dump && IsInterrupted(*dump); ++attempt) dump = DumpOnce(request, family, limit);
  return dump;
}

}  // namespace NQRVZEP20
