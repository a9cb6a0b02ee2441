// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <netinet/in.h>

#include <string>
#include <vector>

namespace usblan {

constexpr int kMaxNodes = 16;

// An IPv4 address with its network, in host byte order.
struct TAddress {
  std::uint32_t fAddress, fMask;
};

struct TInterface {
  std::string fName;
  bool fIsUp = false;
  std::vector<TAddress> fAddresses = {};
  bool fIsThere = true;  // false: named, but missing on this machine
};

// The controller's address of a node, and the address of this side; both are in one network of 24 bits.
std::uint32_t ControllerAddress(int node);
std::uint32_t OwnAddress(int node);
constexpr int kPrefixLength = 24;

// All interfaces of the caller's network namespace, by name. Throws std::system_error.
std::vector<TInterface> AllInterfaces();

// Whether the interface is a USB network interface, according to the kernel's files in `classNet` ("/sys/class/net").
bool IsUsbNetwork(std::string const& classNet, std::string const& name);

// The interfaces that lead to a controller; the index of each is its node. They are the interfaces in `named`, separated by
// blanks, even those missing in `all`. With an empty `named` they are the USB network interfaces in `all` that have no address
// outside of the link-local range.
std::vector<TInterface> ControllerInterfaces(std::vector<TInterface> const& all, std::string const& named,
                                             std::string const& classNet);

// Whether the interface is up and reaches the controller of the node directly.
bool Reaches(TInterface const& interface, int node);

// Gives the interface this side's address of the node. Other addresses stay. Throws std::system_error.
void AddOwnAddress(TInterface const& interface, int node);

// Throws std::system_error.
void TakeUp(TInterface const& interface);

}  // namespace usblan
