// SPDX-License-Identifier: Apache-2.0
#include "AutoProxyDiscovery.h"

#include "TOSSpecific.h"
#include "TZEPException.h"
#include "core/Handles.h"
#include "core/Log.h"
#include "proxy/WpadQuery.h"

#include <arpa/inet.h>
#include <net/if.h>
#include <netinet/in.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <sys/time.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <sstream>
#include <string_view>
#include <vector>

using NQRVZEP20::kDhcpClientPort;
using NQRVZEP20::kWpadAttempts;
using NQRVZEP20::kWpadReplySeconds;
using NQRVZEP20::LogDebug;
using NQRVZEP20::ShownIPV6Address;
using NQRVZEP20::TOSSpecific;
using NQRVZEP20::TUniqueFd;

namespace {

constexpr int kServerPort = 67;
constexpr int kBindAttempts = 11;
constexpr int kBindPauseSeconds = 3;
constexpr int kCommandSilenceSeconds = 300;
constexpr std::size_t kHardwareAddressSize = 6;

// Offsets of the fields of a DHCP message.
constexpr std::size_t kXidOffset = 4;
constexpr std::size_t kCiaddrOffset = 12;
constexpr std::size_t kChaddrOffset = 28;
constexpr std::size_t kMagicCookieOffset = 236;

// ---- Texts and commands ----

bool BeginsWith(std::string_view text, std::string_view beginning) { return text.substr(0, beginning.size()) == beginning; }

// Reads an address as inet_pton does and stores its bytes in `bytes`, which has room for an address of the family. False
// when the text is anything but an address.
bool ReadAddress(int family, std::string const& text, void* bytes) {
  bool const isOneText = text.find('\0') == std::string::npos;
  return isOneText && ::inet_pton(family, text.c_str(), bytes) == 1;
}

unsigned char DigitOf(char digit) {
  if (std::isdigit(static_cast<unsigned char>(digit))) return static_cast<unsigned char>(digit - '0');
  return static_cast<unsigned char>(std::tolower(static_cast<unsigned char>(digit)) - 'a' + 10);
}

bool IsHardwareAddress(std::string const& text) {
  if (text.size() != 3 * kHardwareAddressSize - 1) return false;
  for (std::size_t at = 0; at < text.size(); ++at) {
    bool const isRight = at % 3 == 2 ? text[at] == ':' : std::isxdigit(static_cast<unsigned char>(text[at])) != 0;
    if (!isRight) return false;
  }
  return true;
}

// The output of a command; empty when the command cannot be run.
std::string OutputOf(std::string const& program, std::vector<std::string> const& arguments) {
  try {
    return TOSSpecific::SpawnProcess(program, arguments, kCommandSilenceSeconds);
  } catch (NQRVZEP20::TZEPException const&) {
    return "";
  }
}

// The process number at the start of a line of "ps".
std::string ProcessNumberOf(std::string_view line) {
  constexpr std::string_view kDigits = "0123456789";
  line.remove_prefix(std::min(line.find_first_not_of(' '), line.size()));
  return std::string(line.substr(0, line.find_first_not_of(kDigits)));
}

void EndProcess(std::string const& number) {
  // The null device is misspelt: the output goes to a file of that name. Kept.
  std::string const command = "kill " + number + " > /dev/nul 2>&1";
  [[maybe_unused]] int const ignored = std::system(command.c_str());
}

// ---- Interfaces ----

struct TInterface {
  std::string fName, fAddress, fHardwareAddress;
};

// The names of the interfaces, each once; the system lists an interface once for each of its addresses.
std::vector<std::string> ListInterfaces(int query) {
  std::vector<std::string> names;
  ifconf list{};
  bool isListed = ::ioctl(query, SIOCGIFCONF, &list) == 0;  // asks for the length of the list
  std::vector<ifreq> entries(static_cast<std::size_t>(list.ifc_len) / sizeof(ifreq));
  list.ifc_req = entries.data();
  if (isListed && !entries.empty()) isListed = ::ioctl(query, SIOCGIFCONF, &list) == 0;
  if (!isListed) {
    LogDebug("cpm: send ioctl error !");
    return names;
  }
  entries.resize(static_cast<std::size_t>(list.ifc_len) / sizeof(ifreq));
  for (ifreq const& entry : entries) {
    std::string const name(entry.ifr_name, ::strnlen(entry.ifr_name, sizeof entry.ifr_name));
    if (std::find(names.begin(), names.end(), name) == names.end()) names.push_back(name);
  }
  return names;
}

bool AskSystem(int query, unsigned long request, std::string const& name, ifreq& answer) {
  answer = ifreq{};
  name.copy(answer.ifr_name, sizeof answer.ifr_name - 1);
  if (::ioctl(query, request, &answer) == 0) return true;
  LogDebug("cpm: ioctl device ", name);
  return false;
}

std::string AddressIn(ifreq const& answer) {
  sockaddr_in address{};
  std::memcpy(&address, &answer.ifr_addr, sizeof address);
  char text[INET_ADDRSTRLEN] = "";
  ::inet_ntop(AF_INET, &address.sin_addr, text, sizeof text);
  return text;
}

std::string HardwareAddressIn(ifreq const& answer) {
  std::array<unsigned char, kHardwareAddressSize> bytes;
  std::memcpy(bytes.data(), answer.ifr_hwaddr.sa_data, bytes.size());
  char text[3 * kHardwareAddressSize];
  std::snprintf(text, sizeof text, "%02x:%02x:%02x:%02x:%02x:%02x", bytes[0], bytes[1], bytes[2], bytes[3], bytes[4], bytes[5]);
  return text;
}

// Reads the addresses of an interface, which may be down. Logs the reason and returns false when something cannot be read.
bool ReadInterface(int query, std::string const& name, TInterface& interface) {
  interface.fName = name;
  ifreq answer;
  if (!AskSystem(query, SIOCGIFFLAGS, name, answer)) return false;
  if ((answer.ifr_flags & IFF_PROMISC) != 0) LogDebug("the interface is PROMISC!");
  if ((answer.ifr_flags & IFF_UP) != 0)
    LogDebug("the interface status is UP!");
  else
    LogDebug("the interface status is DOWN!");

  if (!AskSystem(query, SIOCGIFADDR, name, answer)) return false;
  interface.fAddress = AddressIn(answer);
  if (!AskSystem(query, SIOCGIFHWADDR, name, answer)) return false;
  interface.fHardwareAddress = HardwareAddressIn(answer);
  return true;
}

// ---- The query ----

struct TFree {
  void operator()(unsigned char* bytes) const noexcept { std::free(bytes); }
};
using TMessage = std::unique_ptr<unsigned char, TFree>;
using TReply = std::array<unsigned char, AutoProxyDiscovery::kMessageSize>;

// Any packet that arrives at the port counts as the reply; its transaction number is not compared. Kept.
bool Receive(int receiver, TReply& reply) {
  AutoProxyDiscovery::readable_timeo(receiver, kWpadReplySeconds);
  if (::recv(receiver, reply.data(), reply.size(), 0) >= 0) return true;
  LogDebug("receiving  DHCP message error!");
  return false;
}

// Sends the message up to three times, until a packet arrives, and returns the URL in that reply; empty when there is none.
// Bytes that the reply does not fill are 0.
std::string SendAndReceive(int sender, int receiver, unsigned char const* message) {
  TReply reply{};
  for (int attempt = 1; attempt <= kWpadAttempts; ++attempt) {
    if (AutoProxyDiscovery::send_packet(sender, message, AutoProxyDiscovery::kMessageSize) < 0)
      LogDebug("sending DHCP message error!");
    if (Receive(receiver, reply)) return AutoProxyDiscovery::dhcp_parser(reply.data() + AutoProxyDiscovery::kOptionsOffset);
  }
  return "";
}

std::string Ask(TInterface interface) {
  TUniqueFd const sender(AutoProxyDiscovery::open_send_socket());
  if (!sender) return "";
  TUniqueFd const receiver(AutoProxyDiscovery::open_recv_socket(interface.fName.data()));
  if (!receiver) return "";
  TMessage const message(AutoProxyDiscovery::make_message(interface.fAddress, interface.fHardwareAddress));
  return message ? SendAndReceive(sender.get(), receiver.get(), message.get()) : "";
}

// Queries through each "eth" interface until one gives a URL. On return `interface` holds the data read last.
std::string AskForEachInterface(TInterface& interface) {
  TUniqueFd const query(::socket(AF_INET, SOCK_DGRAM, 0));
  if (!query) {
    LogDebug("cpm: send socket error!");
    return "";
  }
  for (std::string const& name : ListInterfaces(query.get())) {
    if (!BeginsWith(name, "eth") || !ReadInterface(query.get(), name, interface)) continue;
    std::string const url = Ask(interface);
    if (!url.empty()) {
      LogDebug("Get  DHCP wpadurl is =", url);
      return url;
    }
  }
  return "";
}

std::string AskWithIPV6Address(TInterface interface) {
  interface.fAddress = ShownIPV6Address();
  if (interface.fAddress.empty()) return "";
  std::string const url = Ask(interface);
  if (!url.empty()) LogDebug("Get  DHCP wpadurl via IPV6 is =", url);
  return url;
}

sockaddr_in AddressOf(in_addr_t address, int port) {
  sockaddr_in name{};
  name.sin_family = AF_INET;
  name.sin_port = htons(static_cast<std::uint16_t>(port));
  name.sin_addr.s_addr = htonl(address);
  return name;
}

bool BindTo(int socket, sockaddr_in const& name) {
  return ::bind(socket, reinterpret_cast<sockaddr const*>(&name), sizeof name) == 0;
}

}  // namespace

std::string AutoProxyDiscovery::StartWpad() {
  wpadPreconfig();
  TInterface interface;
  std::string const url = AskForEachInterface(interface);
  return url.empty() ? AskWithIPV6Address(interface) : url;
}

void AutoProxyDiscovery::wpadPreconfig() {
  std::istringstream processes(OutputOf("ps", {"-e"}));
  for (std::string line; std::getline(processes, line);) {
    if (line.find("dhclient") == std::string::npos) continue;
    std::string const number = ProcessNumberOf(line);
    if (!number.empty()) EndProcess(number);
  }
}

unsigned char* AutoProxyDiscovery::make_message(std::string const& address, std::string const& hardwareAddress,
                                                unsigned char*& message) {
  constexpr unsigned char kHead[] = {1, 1, kHardwareAddressSize, 0};  // request, Ethernet, size of its addresses, no hops
  constexpr std::uint32_t kXid = 1983;                                // always the same, in the machine's byte order. Kept.
  constexpr unsigned char kOptions[] = {0x63, 0x82, 0x53, 0x63,       // the magic cookie
                                        0x35, 0x01, 0x08,             // message type: DHCPINFORM
                                        0x37, 0x01, 0xfc,             // requested: option 252
                                        0xff};
  message = static_cast<unsigned char*>(xzalloc(kMessageSize));
  if (message == nullptr) return nullptr;
  std::uint32_t const ciaddr = GetCiaddr(address);
  std::memcpy(message, kHead, sizeof kHead);
  std::memcpy(message + kXidOffset, &kXid, sizeof kXid);
  std::memcpy(message + kCiaddrOffset, &ciaddr, sizeof ciaddr);
  GetChaddr(hardwareAddress, message + kChaddrOffset);
  std::memcpy(message + kMagicCookieOffset, kOptions, sizeof kOptions);
  return message;
}

unsigned char* AutoProxyDiscovery::make_message(std::string const& address, std::string const& hardwareAddress,
                                                unsigned char** message) {
  unsigned char* made = nullptr;
  make_message(address, hardwareAddress, made);
  if (message != nullptr) *message = made;
  return made;
}

std::uint32_t AutoProxyDiscovery::GetCiaddr(std::string const& address) {
  if (address.find(':') == std::string::npos) {
    LogDebug("IP v4 Format!");
    return GetIPV4Ciaddr(address);
  }
  LogDebug("IP v6 Format!");
  return GetIPV6Ciaddr(address);
}

std::uint32_t AutoProxyDiscovery::GetIPV4Ciaddr(std::string const& address) {
  in_addr parsed{};
  if (ReadAddress(AF_INET, address, &parsed)) return parsed.s_addr;
  LogDebug("invalid IP Format : ", address);
  return 0;
}

std::uint32_t AutoProxyDiscovery::GetIPV6Ciaddr(std::string const& address) {
  in6_addr parsed{};
  if (!ReadAddress(AF_INET6, address, &parsed)) {
    LogDebug("invalid IP Format : ", address);
    return 0;
  }
  std::uint32_t mapped = 0;
  if (IN6_IS_ADDR_V4MAPPED(&parsed)) std::memcpy(&mapped, parsed.s6_addr + 12, sizeof mapped);
  return mapped;
}

void AutoProxyDiscovery::GetChaddr(std::string const& hardwareAddress, unsigned char* bytes) {
  if (!IsHardwareAddress(hardwareAddress)) {
    LogDebug("invalid MAC Format!");
    return;
  }
  for (std::size_t at = 0; at < kHardwareAddressSize; ++at)
    bytes[at] = static_cast<unsigned char>(DigitOf(hardwareAddress[3 * at]) << 4 | DigitOf(hardwareAddress[3 * at + 1]));
}

int AutoProxyDiscovery::open_send_socket() {
  TUniqueFd sender(::socket(AF_INET, SOCK_DGRAM, 0));
  int const allowed = 1;
  if (sender && ::setsockopt(sender.get(), SOL_SOCKET, SO_BROADCAST, &allowed, sizeof allowed) == 0) return sender.release();
  LogDebug("open_send_socket failed!");
  return -1;
}

int AutoProxyDiscovery::open_recv_socket(char*) {
  TUniqueFd receiver(::socket(AF_INET, SOCK_DGRAM, 0));
  if (!receiver) {
    LogDebug("setup socket failed!");
    return -1;
  }
  for (int attempt = 1; !BindTo(receiver.get(), AddressOf(INADDR_ANY, kDhcpClientPort)); ++attempt) {
    LogDebug("bind to DHCP_CLIENT_PORT failed!");
    if (attempt == kBindAttempts) break;  // the socket is returned without a port. Kept.
    ::sleep(kBindPauseSeconds);
  }
  return receiver.release();
}

long AutoProxyDiscovery::send_packet(int socket, unsigned char const* bytes, long size) {
  sockaddr_in const everyone = AddressOf(INADDR_BROADCAST, kServerPort);
  return ::sendto(socket, bytes, static_cast<std::size_t>(size), 0, reinterpret_cast<sockaddr const*>(&everyone),
                  sizeof everyone);
}

int AutoProxyDiscovery::readable_timeo(int socket, int seconds) {
  timeval const limit{seconds, 0};
  return ::setsockopt(socket, SOL_SOCKET, SO_RCVTIMEO, &limit, sizeof limit);
}

std::string AutoProxyDiscovery::dhcp_parser(unsigned char* options) {
  constexpr unsigned char kUrl = 252;
  constexpr unsigned char kEnd = 255;
  std::size_t at = 0;
  while (at + 1 < kOptionsSize && options[at] != kEnd) {
    std::size_t const length = options[at + 1];
    std::size_t const next = at + 2 + length;
    if (options[at] == kUrl) {
      // A value that does not end within the area counts as missing: half a URL would lead elsewhere.
      return next <= kOptionsSize ? std::string(options + at + 2, options + next) : "";
    }
    at = next;  // a pad, too, is read as if a length followed it. Kept.
  }
  return "";
}

void* AutoProxyDiscovery::xzalloc(unsigned long size) { return std::calloc(1, size); }
