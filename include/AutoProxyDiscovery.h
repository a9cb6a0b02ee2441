// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <cstdint>
#include <string>

// Finds the web proxy: queries the DHCP server of the local network for the URL of the proxy configuration file (Web Proxy
// Auto-Discovery, DHCP option 252) with a DHCPINFORM message.
//
// The class is in the global namespace. All functions are static; each runs on the caller's thread, blocks until done and
// does not throw. Failures are logged at debug severity. 32-bit addresses are in network byte order, as in the message. Only
// root may bind the port of DHCP clients (68), and only one program on the machine can have it open.
class ZEP_EXPORT AutoProxyDiscovery {
public:
  // The size in bytes of the message sent, and the maximum number of bytes read from a reply.
  static constexpr long kMessageSize = 1472;
  static constexpr long kOptionsOffset = 240;  // the offset of the options in a message
  static constexpr long kOptionsSize = kMessageSize - kOptionsOffset;

  // Runs the complete discovery. Returns the value of option 252, usually the URL of a proxy configuration file, or an
  // empty string when no reply contains one. The file is not fetched.
  //
  // First it kills the DHCP clients (wpadPreconfig). Then it sends a query for each interface whose name begins with "eth",
  // with the IPv4 address of the interface. A reply with a URL ends the discovery; a reply without one ends only the query
  // for that interface. If no reply contains a URL, one more query follows, with the first IPv6 address that the command
  // "ifconfig" prints after "inet6 addr: " and the hardware address that was read last. This query is skipped when "ifconfig"
  // prints no such address, as with the format of net-tools 2.
  //
  // An unanswered query takes 18 seconds: three attempts of six. All messages take the route to 255.255.255.255, whichever
  // interface they describe.
  static std::string StartWpad();

  // ---- The steps ----

  // Kills, with the command "kill", every process whose line in the output of "ps -e" contains "dhclient". The output of
  // "kill" is redirected to a file /dev/nul; if that file cannot be created, as when the caller is not root, no process is
  // killed. Kept.
  //
  // The lines are not checked. The "ps" of BusyBox prints a process name with a line break as two lines, so any user can
  // produce a line with any process ID, and root then kills that process. A caller that runs as root should first check each
  // such line: it must begin with the ID of a process whose /proc/PID/comm contains "dhclient" (docs/security.md).
  static void wpadPreconfig();

  // Builds the DHCPINFORM message for an interface with that address (IPv4 or IPv6) and hardware address: kMessageSize bytes,
  // which the caller frees with free(). The message is returned and also stored in the last argument, unless that is null;
  // both are null if memory cannot be allocated. If an address cannot be parsed, its field is 0.
  static unsigned char* make_message(std::string const& address, std::string const& hardwareAddress, unsigned char*& message);
  static unsigned char* make_message(std::string const& address, std::string const& hardwareAddress,
                                     unsigned char** message = nullptr);

  // The address field of the message. A string with a colon is parsed as IPv6 (GetIPV6Ciaddr), any other as IPv4
  // (GetIPV4Ciaddr).
  static std::uint32_t GetCiaddr(std::string const& address);

  // Parses a dotted quad. Any other string gives 0.
  static std::uint32_t GetIPV4Ciaddr(std::string const& address);

  // Extracts the IPv4 address from an IPv4-mapped IPv6 address ("::ffff:10.0.0.2"). Any other IPv6 address does not fit into
  // the message and gives 0: the server then replies to the source address of the message. A string that is not an IPv6
  // address gives 0, too.
  static std::uint32_t GetIPV6Ciaddr(std::string const& address);

  // Parses six pairs of hexadecimal digits, separated by colons, into six bytes. Any other string leaves the bytes unchanged.
  static void GetChaddr(std::string const& hardwareAddress, unsigned char* bytes);

  // Returns a UDP socket with broadcasts enabled, which the caller closes, or -1 on failure.
  static int open_send_socket();

  // Returns a UDP socket that is bound to port 68 on all addresses, which the caller closes, or -1 if no socket can be
  // created. If the port cannot be bound, retries every 3 seconds. After 11 failed attempts it returns the unbound socket.
  // Kept. The argument, the name of an interface, is not used.
  static int open_recv_socket(char* interfaceName);

  // Sends `size` bytes to 255.255.255.255, port 67. Returns the number of bytes sent, or -1 with errno set.
  static long send_packet(int socket, unsigned char const* bytes, long size);

  // Sets the receive timeout of the socket. Returns 0, or -1 with errno set.
  static int readable_timeo(int socket, int seconds);

  // Returns the value of the first option 252 in an options area of kOptionsSize bytes. It is empty when there is no such
  // option, when its length is 0, or when its value does not end within the area. Reads no byte after the area. A pad option
  // (code 0) is parsed as if a length followed it. Kept.
  static std::string dhcp_parser(unsigned char* options);

  // Returns zero-filled memory, which the caller frees with free(), or null if it cannot be allocated.
  static void* xzalloc(unsigned long size);
};
