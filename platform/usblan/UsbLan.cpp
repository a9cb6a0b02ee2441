// SPDX-License-Identifier: Apache-2.0

// The functions of ovdusblan.so.

#include "platform/include/usblan.h"

#include "platform/usblan/Interfaces.h"

#include <errno.h>

#include <cstdlib>
#include <new>
#include <system_error>

namespace {

// The interface of each node.
std::vector<usblan::TInterface> Nodes() {
  char const* const named = std::getenv("ZEP_USBLAN_INTERFACES");
  return usblan::ControllerInterfaces(usblan::AllInterfaces(), named != nullptr ? named : "", "/sys/class/net");
}

bool IsNode(std::vector<usblan::TInterface> const& nodes, int node) { return node >= 0 && node < static_cast<int>(nodes.size()); }

int BringUp(int node) {
  std::vector<usblan::TInterface> const nodes = Nodes();
  if (!IsNode(nodes, node)) return ENODEV;
  usblan::TInterface const& interface = nodes[static_cast<std::size_t>(node)];
  if (!interface.fIsThere) return ENODEV;
  if (usblan::Reaches(interface, node)) return 0;
  usblan::TakeUp(interface);
  usblan::AddOwnAddress(interface, node);
  return 0;
}

}  // namespace

#pragma GCC visibility push(default)

int GetNodes() try { return static_cast<int>(Nodes().size()); } catch (std::exception const&) {
  return 0;
}

int QueryOvdLanState(int node) try {
  std::vector<usblan::TInterface> const nodes = Nodes();
  return IsNode(nodes, node) && usblan::Reaches(nodes[static_cast<std::size_t>(node)], node) ? 1 : 0;
} catch (std::exception const&) {
  return 0;
}

int BringupOvdLan(int node) try { return BringUp(node); } catch (std::system_error const& failure) {
  return failure.code().value();
} catch (std::bad_alloc const&) {
  return ENOMEM;
}

#pragma GCC visibility pop
