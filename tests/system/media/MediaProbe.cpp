// SPDX-License-Identifier: Apache-2.0

// Runs one operation on removable media, in a virtual machine that has some, and prints the result.
//
//   MediaProbe virtual KIND KEEPWHOLE  the controller's virtual devices
//   MediaProbe enumerate [COMMAND]     the media found by the host provider's namespace; COMMAND is run after it is filled
//   MediaProbe ids DEVICEID...         the media found by a namespace of disks with these identifiers
//   MediaProbe mount DEVICE
//   MediaProbe umount DEVICE DIRECTORY
//   MediaProbe eject DEVICE            opens the tray of an optical drive

#include "INamespaceProvider.h"
#include "INamespaceProviderManager.h"
#include "TOSSpecific.h"
#include "TRootObject.h"
#include "core/Handles.h"
#include "providers/memory/TMemoryNamespace.h"
#include "tests/Support.h"

#include <fcntl.h>
#include <linux/cdrom.h>
#include <sys/ioctl.h>
#include <boost/make_shared.hpp>

#include <cstdlib>
#include <iostream>
#include <stdexcept>

namespace {

using namespace NQRVZEP20;
using TArguments = std::vector<std::string>;

void ListVirtualDevices(int kind, bool keepWhole) {
  std::vector<std::string> devices;
  TOSSpecific::getxBMCVirtualDevices(kind, devices, keepWhole);
  for (std::string const& device : devices) std::cout << device << "\n";
}

void Enumerate(boost::shared_ptr<ICIMNamespace> ns) {
  TLogCapture const log;
  for (TRemovableMedium const& medium : TOSSpecific::EnumerateRemovableMedia(ns))
    std::cout << medium.fDevice << "|" << medium.fDescription << "|" << medium.fMountPoint << "\n";
  for (std::string const& entry : log.Entries())
    if (entry.find("No mapping") != entry.npos || entry.find("Failed ioctl") != entry.npos ||
        entry.find("Failed mounting") != entry.npos || entry.find("CaptureFile failed") != entry.npos)
      std::cout << entry << "\n";
}

boost::shared_ptr<ICIMNamespace> HostNamespace() {
  TOSSpecific::LoadNSPLibrary("Host");
  auto const provider = TRootObject::GetNamespaceProviderManager()->GetNamespaceProvider("Host");
  return provider->GetNamespace(TCIMContext());
}

boost::shared_ptr<ICIMNamespace> NamespaceOf(TArguments const& ids) {
  auto const ns = boost::make_shared<TMemoryNamespace>("root/test");
  auto cls = ns->DefineClass("QRVSG_SCSIDevice");
  cls.Key("DeviceID", "string");
  for (char const* property : {"DeviceType", "ProductID", "VendorID"}) cls.Property(property, "string");
  for (std::string const& id : ids)
    ns->AddInstance("QRVSG_SCSIDevice",
                    {{"DeviceID", id}, {"DeviceType", "Direct Access Device"}, {"ProductID", "Disk"}, {"VendorID", "Maker"}});
  return ns;
}

void Eject(std::string const& device) {
  TUniqueFd const drive(::open(device.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
  if (!drive || ::ioctl(drive.get(), CDROMEJECT) != 0) throw std::runtime_error("cannot eject " + device);
}

void Do(std::string const& operation, TArguments const& arguments) {
  if (operation == "virtual") return ListVirtualDevices(std::stoi(arguments.at(0)), arguments.at(1) == "1");
  if (operation == "ids") return Enumerate(NamespaceOf(arguments));
  if (operation == "mount") return void(std::cout << TOSSpecific::MountDevice(arguments.at(0)) << "\n");
  if (operation == "umount") return TOSSpecific::UnmountDevice(arguments.at(0), arguments.at(1));
  if (operation == "eject") return Eject(arguments.at(0));
  auto const ns = HostNamespace();
  if (!arguments.empty() && std::system(arguments[0].c_str()) != 0) std::cout << "the command failed\n";
  Enumerate(ns);
}

}  // namespace

int main(int argc, char** argv) try { Do(argv[1], TArguments(argv + 2, argv + argc)); } catch (std::exception const& thrown) {
  std::cout << thrown.what() << "\n";
}
