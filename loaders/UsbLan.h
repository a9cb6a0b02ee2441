// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

// Brings up the USB-LAN of each node through ./ovdusblan.so. IIPMILan::bringupOvdLan documents the result.
bool BringUpUsbLan();

}  // namespace NQRVZEP20
