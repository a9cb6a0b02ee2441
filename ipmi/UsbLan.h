#pragma once

namespace NQRVZEP20 {

// Brings up the USB-LAN of every node through ./ovdusblan.so, as IIPMILan::bringupOvdLan says.
bool BringUpUsbLan();

}  // namespace NQRVZEP20
