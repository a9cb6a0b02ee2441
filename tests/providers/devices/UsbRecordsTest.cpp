// SPDX-License-Identifier: Apache-2.0
#include "providers/devices/UsbRecords.h"

#include "tests/Support.h"
#include "tests/providers/devices/RecordText.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using testing::IsEmpty;

class UsbRecordsTest : public testing::Test {
protected:
  // Adds a device in that directory below /sys/devices, with these files.
  void Add(std::string const& path, std::vector<std::pair<std::string, std::string>> const& files) {
    fs::path const directory = fs::path(fDir.Path("sys/devices")) / path;
    fs::create_directories(directory);
    for (auto const& [file, text] : files) WriteFile((directory / file).string(), text + "\n");
    fs::create_directories(fDir.Path("sys/bus/usb/devices"));
    fs::create_symlink("../../../devices/" + path, fDir.Path("sys/bus/usb/devices/" + directory.filename().string()));
  }
  std::vector<TUsbDevice> Devices() const { return UsbDevices(fFiles, TComputerSystem(fFiles)); }

  TTempDir fDir;
  TMachineFiles fFiles{fDir.Path()};
};

TEST_F(UsbRecordsTest, SpeedsAreInMegabits) {
  EXPECT_EQ(*UsbSpeedFrom("1.5"), 1500000u);
  EXPECT_EQ(*UsbSpeedFrom("480"), 480000000u);
  EXPECT_EQ(*UsbSpeedFrom("20000"), 20000000000u);
  for (char const* text : {"", "unknown", "-1", "0", "1e99", "nan", "12x"}) EXPECT_FALSE(UsbSpeedFrom(text)) << text;
}

TEST_F(UsbRecordsTest, VersionsAreBinaryCodedDecimal) {
  EXPECT_EQ(*UsbVersionFrom("2.00"), 0x0200);
  EXPECT_EQ(*UsbVersionFrom(" 2.10"), 0x0210);
  EXPECT_EQ(*UsbVersionFrom("1.1"), 0x0101);
  for (char const* text : {"", "2", "2.", "x.10", "2.10a", "2.100"}) EXPECT_FALSE(UsbVersionFrom(text)) << text;
}

TEST_F(UsbRecordsTest, ADeviceIsBelowItsHubAndController) {
  Add("pci0000:00/0000:00:01.0/usb1",
      {{"bDeviceClass", "09"}, {"speed", "480"}, {"maxchild", "4"}, {"product", "xHCI Host Controller"}});
  Add("pci0000:00/0000:00:01.0/usb1/1-2", {{"bDeviceClass", "00"},
                                           {"speed", "12"},
                                           {"idVendor", "0627"},
                                           {"idProduct", "00ff"},
                                           {"version", " 2.00"},
                                           {"manufacturer", "QEMU"},
                                           {"product", "QEMU \x1b[2J<b>"},
                                           {"bMaxPower", "100mA"},
                                           {"bMaxPacketSize0", "64"}});
  Add("pci0000:00/0000:00:01.0/usb1/1-2/1-2:1.0", {{"bInterfaceClass", "03"}});
  fs::create_directories(fDir.Path("sys/bus/usb/drivers/usbhid"));
  fs::create_symlink("/sys/bus/usb/drivers/usbhid", fDir.Path("sys/devices/pci0000:00/0000:00:01.0/usb1/1-2/1-2:1.0/driver"));
  auto const devices = Devices();
  ASSERT_EQ(devices.size(), 2u);
  EXPECT_EQ(devices[0].fName, "1-2");
  EXPECT_EQ(devices[0].fHub, "usb1");
  EXPECT_EQ(devices[0].fController, "0000:00:01.0");
  EXPECT_FALSE(devices[0].fIsHub);
  EXPECT_EQ(*devices[0].fSpeed, 12000000u);
  EXPECT_EQ(ValueIn(devices[0].fRecord, "VendorID"), "1575");
  EXPECT_EQ(ValueIn(devices[0].fRecord, "ProductID"), "255");
  EXPECT_EQ(ValueIn(devices[0].fRecord, "Manufacturer"), "QEMU");
  EXPECT_EQ(ValueIn(devices[0].fRecord, "Product"), "QEMU \x1b[2J<b>");
  EXPECT_EQ(ValueIn(devices[0].fRecord, "SerialNumber"), "<the device does not report it>");
  EXPECT_EQ(ValueIn(devices[0].fRecord, "MaxPacketSize"), "64");
  EXPECT_EQ(ValueIn(devices[0].fRecord, "OtherIdentifyingInfo"), "{ usbhid, 100mA }");
  EXPECT_EQ(devices[1].fName, "usb1");
  EXPECT_EQ(devices[1].fHub, "");
  EXPECT_EQ(devices[1].fController, "0000:00:01.0");
  EXPECT_TRUE(devices[1].fIsHub);
  EXPECT_EQ(ValueIn(devices[1].fRecord, "NumberOfPorts"), "4");
}

TEST_F(UsbRecordsTest, ADeviceThatVanishesIsOmitted) {
  Add("usb1", {});
  EXPECT_THAT(Devices(), IsEmpty());
}

TEST_F(UsbRecordsTest, WithoutDevicesThereIsAReason) {
  EXPECT_EQ(WhyNoUsbDevices(fFiles).fReason, "the kernel lists no USB devices: /sys/bus/usb/devices/ does not exist");
}

}  // namespace
}  // namespace NQRVZEP20
