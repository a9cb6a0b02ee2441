// SPDX-License-Identifier: Apache-2.0
#ifndef ZEP_PLATFORM_USBLAN_H
#define ZEP_PLATFORM_USBLAN_H

/*
 * The bring-up library of the controller's USB-LAN, ovdusblan.so. The core loads it at run time by GetNodes,
 * QueryOvdLanState and BringupOvdLan and never links it.
 *
 * A node is an interface of this machine that leads to a controller; node n's controller has the address
 * 169.254.(95 + n).118. Nothing is remembered between calls. Changes need the right to configure interfaces.
 *
 * The interfaces are the USB network interfaces (drivers cdc_ether, cdc_subset, rndis_host) of the caller's network
 * namespace, in the order of their names, except those with an IPv4 address that is not link-local: such an interface
 * leads elsewhere. The environment variable ZEP_USBLAN_INTERFACES names other interfaces instead, separated by blanks: the first
 * is node 0, the second node 1, and so on. A missing interface is a node without an interface; the
 * others keep their nodes. Only the first 16 interfaces are nodes.
 */

#ifdef __cplusplus
extern "C" {
#endif

/* The number of nodes, 0 to 16. Each named interface counts, even a missing one. */
int GetNodes(void);

/* 1 when the interface of the node is up and has an address from which the controller is reached directly, else 0. */
int QueryOvdLanState(int node);

/*
 * Brings up the interface of the node and gives it the address 169.254.(95 + n).1/24, unless it already has one from which
 * the controller is reached. Other addresses are kept. Returns 0, or an errno value: ENODEV when the node does not exist or its
 * interface is missing, EPERM without the permission to configure it.
 */
int BringupOvdLan(int node);

#ifdef __cplusplus
}
#endif

#endif
