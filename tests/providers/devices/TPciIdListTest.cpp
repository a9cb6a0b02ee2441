// SPDX-License-Identifier: Apache-2.0
#include "providers/devices/TPciIdList.h"

#include "tests/Support.h"

extern "C" {
#include <pci/pci.h>
}

#include <cstdio>
#include <sstream>

namespace NQRVZEP20 {
namespace {

constexpr char const* kInstalled = "/usr/share/misc/pci.ids";

constexpr char const* kText =
    "#\tList of PCI IDs\n"
    "\n"
    "8086  Intel Corporation\n"
    "\t10d3  82574L Gigabit Network Connection\n"
    "\t\t103c 1785  NC112i 1-port Ethernet Server Adapter\n"
    "# nee another name\n"
    "\t\t8086 a01f  Gigabit CT Desktop Adapter \t\n"
    "\t10d4 An adapter after one blank\r\n"
    "\t10d5  \n"
    "8087  Another vendor\n"
    "\t10d6  82576\n"
    "C 02  Network controller\n"
    "\t00  Ethernet controller\n"
    "\t\t01  An interface\n"
    "\t80  Network controller\n"
    "C ff  Unassigned class";

// Bytes without a terminating zero: a sanitizer reports a read past the last.
class TText {
public:
  explicit TText(std::string const& text) : fBytes(text.begin(), text.end()) {}
  std::string_view View() const { return {fBytes.data(), fBytes.size()}; }

private:
  std::vector<char> fBytes;
};

struct TRow {
  TPciNumbers fNumbers;
  char const* fVendor;
  char const* fDevice;
  char const* fSubsystem;
  char const* fClass;
};

constexpr TRow kRows[] = {
    {{0x8086, 0x10d3, 0x103c, 0x1785, 0x020000},
     "Intel Corporation",
     "82574L Gigabit Network Connection",
     "NC112i 1-port Ethernet Server Adapter",
     "Ethernet controller"},
    {{0x8086, 0x10d3, 0x8086, 0xa01f, 0x020001},
     "Intel Corporation",
     "82574L Gigabit Network Connection",
     "Gigabit CT Desktop Adapter",
     "Ethernet controller"},
    {{0x8086, 0x10d3, 0x8086, 0x10d3, 0x028000},
     "Intel Corporation",
     "82574L Gigabit Network Connection",
     "82574L Gigabit Network Connection",
     "Network controller"},
    {{0x8086, 0x10d4, 0x103c, 0x1785, 0x020100},
     "Intel Corporation",
     "An adapter after one blank",
     "",
     "Network controller [0201]"},
    {{0x8086, 0x10d5, 0x103c, 0x1785, 0xff0000}, "Intel Corporation", "", "", "Unassigned class [ff00]"},
    {{0x8086, 0x10d6, 0x8086, 0x10d6, 0xfe0000}, "Intel Corporation", "", "", ""},
    {{0x8087, 0x10d6, 0, 0, 0x000100}, "Another vendor", "82576", "", ""},
    {{0x8088, 0x10d3, 0x103c, 0x1785, 0x000000}, "", "", "", ""},
};

TEST(TPciIdListTest, ANumberHasTheNameOfItsLine) {
  TText const text(kText);
  TPciIdList const list(text.View());
  for (TRow const& row : kRows) {
    SCOPED_TRACE(testing::Message() << std::hex << row.fNumbers.fVendor << ":" << row.fNumbers.fDevice);
    EXPECT_EQ(list.VendorOf(row.fNumbers), row.fVendor);
    EXPECT_EQ(list.DeviceOf(row.fNumbers), row.fDevice);
    EXPECT_EQ(list.SubsystemOf(row.fNumbers), row.fSubsystem);
    EXPECT_EQ(list.ClassOf(row.fNumbers), row.fClass);
  }
}

TEST(TPciIdListTest, AnEmptyListContainsNothing) {
  TPciIdList const list("");
  EXPECT_EQ(list.VendorOf({}), "");
  EXPECT_EQ(list.ClassOf({}), "");
}

// The names that libpci gives.
class TLibPci {
public:
  TLibPci() : fAccess(::pci_alloc()) {
    fAccess->warning = Ignore;
    fAccess->debug = Ignore;
  }
  ~TLibPci() { ::pci_cleanup(fAccess); }
  TLibPci(TLibPci const&) = delete;
  TLibPci& operator=(TLibPci const&) = delete;

  std::string Name(int kind, int a, int b = 0, int c = 0, int d = 0) const {
    char buffer[1024];
    int const flags = kind | PCI_LOOKUP_NO_NUMBERS | PCI_LOOKUP_NO_HWDB;
    char const* const name = ::pci_lookup_name(fAccess, buffer, sizeof buffer, flags, a, b, c, d);
    return name != nullptr ? name : "";
  }

private:
  static void Ignore(char*, ...) {}

  pci_access* fAccess;
};

// The numbers of the line, after those of the lines above it. False for a line without numbers.
bool ReadNumbers(std::string const& line, TPciNumbers& numbers) {
  unsigned one = 0, other = 0;
  if (std::sscanf(line.c_str(), "C %2x", &one) == 1) {
    numbers.fClass = one << 16 | 0xff00;  // no list contains this subclass
  } else if (std::sscanf(line.c_str(), "\t\t%4x %4x", &one, &other) == 2 && line[1] == '\t') {
    numbers.fSubsystemVendor = static_cast<std::uint16_t>(one);
    numbers.fSubsystem = static_cast<std::uint16_t>(other);
  } else if (std::sscanf(line.c_str(), "%4x", &one) != 1) {
    return false;
  } else if (line[0] != '\t') {
    numbers.fVendor = static_cast<std::uint16_t>(one);
  } else if (line[1] != '\t') {
    // Below a class the number is a subclass, below a vendor a device.
    numbers.fClass = (numbers.fClass & 0xff0000) | (one & 0xff) << 8;
    numbers.fDevice = static_cast<std::uint16_t>(one);
  }
  return true;
}

TEST(TPciIdListTest, EachNameInTheInstalledListIsThatOfLibpci) {
  NEEDS(std::filesystem::exists(kInstalled), "the package pci.ids");
  TText const text(ReadFile(kInstalled));
  TPciIdList const list(text.View());
  TLibPci const peer;
  TPciNumbers n{};
  std::istringstream lines(ReadFile(kInstalled));
  std::size_t compared = 0;
  for (std::string line; std::getline(lines, line);) {
    if (!ReadNumbers(line, n)) continue;
    ++compared;
    if (line[0] != '\t') {
      ASSERT_EQ(list.VendorOf(n), peer.Name(PCI_LOOKUP_VENDOR, n.fVendor)) << line;
      ASSERT_EQ(list.ClassOf(n), peer.Name(PCI_LOOKUP_CLASS, static_cast<int>(n.fClass >> 8))) << line;
    } else if (line[1] != '\t') {
      ASSERT_EQ(list.DeviceOf(n), peer.Name(PCI_LOOKUP_DEVICE, n.fVendor, n.fDevice)) << line;
      ASSERT_EQ(list.ClassOf(n), peer.Name(PCI_LOOKUP_CLASS, static_cast<int>(n.fClass >> 8))) << line;
    } else if (n.fDevice != 0) {  // libpci does not look for subsystems of a device with the number 0
      int const kind = PCI_LOOKUP_SUBSYSTEM | PCI_LOOKUP_DEVICE;
      ASSERT_EQ(list.SubsystemOf(n), peer.Name(kind, n.fVendor, n.fDevice, n.fSubsystemVendor, n.fSubsystem)) << line;
    }
  }
  EXPECT_GT(compared, 20000u);
}

}  // namespace
}  // namespace NQRVZEP20
