// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <cstdint>
#include <string>

// Finds the web proxy: asks the DHCP server of the local network for the address of the proxy configuration file (Web Proxy
// Auto-Discovery, DHCP option 252) with a DHCPINFORM message.
//
// At global scope, as callers name it. Static operations only; each runs on the caller's thread, blocks until done and
// throws nothing. What fails is in the log at debug severity. Addresses of 32 bits are in network byte order, as they go
// into the message. Only root may listen on the port of DHCP clients, and only one program of a machine.
class ZEP_EXPORT AutoProxyDiscovery {
public:
  static constexpr long kMessageSize = 1472;   // of the message sent, whole, and the most that is taken of a reply
  static constexpr long kOptionsOffset = 240;  // where the options begin in a message
  static constexpr long kOptionsSize = kMessageSize - kOptionsOffset;

  // The whole discovery: returns what the DHCP server names, usually the URL of a proxy configuration file, which is not
  // fetched; empty when nobody does.
  //
  // Ends the DHCP clients first (wpadPreconfig). Then asks for each interface whose name begins with "eth", with its IPv4
  // address; a reply with a URL ends the discovery, one without it only the asking for that interface. In the end asks once
  // more, for the first IPv6 address that the command "ifconfig" shows behind "inet6 addr: " and with the hardware address
  // read last; an "ifconfig" of another format, as that of net-tools 2, shows none, and nothing is asked.
  //
  // An asking that no reply ends takes 18 seconds: three times six. All messages leave by the route to 255.255.255.255,
  // whichever interface they are about.
  static std::string StartWpad();

  // ---- The steps ----

  // Ends, by the command "kill", every process whose line in the output of "ps -e" holds "dhclient". What the command says
  // lands in a file /dev/nul; where that cannot be made, as without root's rights, nothing is ended.
  //
  // The lines are taken as they are. A "ps" that prints a name with a line break as two lines, as BusyBox does, lets any user
  // make a line with any number, and root then ends that process. A caller with root's rights looks first whether the number
  // before each such line is that of a process whose /proc/PID/comm holds "dhclient" (docs/security.md).
  static void wpadPreconfig();

  // The DHCPINFORM message about an interface with that address (IPv4 or IPv6) and hardware address, kMessageSize bytes made
  // by xzalloc. The message is returned and also put into the last argument (if not null); the caller frees it with free().
  // What cannot be read of the texts stays 0 in the message. Null, in both places, without memory.
  static unsigned char* make_message(std::string const& address, std::string const& hardwareAddress, unsigned char*& message);
  static unsigned char* make_message(std::string const& address, std::string const& hardwareAddress,
                                     unsigned char** message = nullptr);

  // The address for the message. A text with a colon is taken for IPv6.
  static std::uint32_t GetCiaddr(std::string const& address);

  // A dotted quad. 0 for any other text.
  static std::uint32_t GetIPV4Ciaddr(std::string const& address);

  // The IPv4 address within an IPv4-mapped one ("::ffff:10.0.0.2"). Any other IPv6 address has no place in the message: 0,
  // which tells the server to answer to the address that the message came from. 0 also for a text that is no address.
  static std::uint32_t GetIPV6Ciaddr(std::string const& address);

  // Reads six pairs of hexadecimal digits with colons between them into six bytes. Any other text leaves them as they are.
  static void GetChaddr(std::string const& hardwareAddress, unsigned char* bytes);

  // A UDP socket that may broadcast, for the caller to close; -1 when there is none.
  static int open_send_socket();

  // A UDP socket bound to port 68 of every address, for the caller to close; -1 when there is none. While the port is taken
  // it tries again every 3 seconds, 11 times in all, and at last returns the socket without a port. The argument, the name
  // of an interface, is not used.
  static int open_recv_socket(char* interfaceName);

  // Sends that many bytes to 255.255.255.255, port 67. Returns how many were sent; -1, with errno, when that failed.
  static long send_packet(int socket, unsigned char const* bytes, long size);

  // How long a receive on that socket waits. Returns 0; -1, with errno, when that failed.
  static int readable_timeo(int socket, int seconds);

  // The value of the first option 252 in an options area of kOptionsSize bytes; empty when there is none, when its length is
  // 0, or when the area ends before it does. Reads no byte behind the area. Code 0 is an option like any other, with a
  // length.
  static std::string dhcp_parser(unsigned char* options);

  // Zero-filled memory, for the caller to free with free(). Null when there is none.
  static void* xzalloc(unsigned long size);
};
