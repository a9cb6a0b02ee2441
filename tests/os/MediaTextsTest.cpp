// SPDX-License-Identifier: Apache-2.0
#include "os/MediaTexts.h"

#include "tests/Support.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using TLines = std::vector<std::string>;

std::string Sample(std::string const& name) { return ReadFile(TestDataPath("hwinfo/" + name)); }

// ---- DeviceFilesIn ----

TEST(MediaTextsTest, FindsTheMarkedDevicesOfRealTexts) {
  struct TRow {
    char const *fText, *fHeader, *fMarker;
    TLines fFiles;
  };
  TRow const rows[] = {
      {"disk.txt", "Hardware Class: disk", "Virtual", {"/dev/sdc (/dev/sg3)"}},
      {"cdrom.txt", "Hardware Class: cdrom", "0x4012", {"/dev/sr1 (/dev/sg4)"}},
      {"keyboard.txt", "Hardware Class: keyboard", "0x4012", {"/dev/input/event4"}},
      {"mouse.txt", "Hardware Class: mouse", "0x4012", {"/dev/input/mice (/dev/input/mouse2)"}},
      {"disk.txt", "Hardware Class: disk", "QEMU HARDDISK", {"/dev/sdb (/dev/sg2)", "/dev/sda (/dev/sg0)"}},
      {"disk.txt", "Hardware Class: cdrom", "Virtual", {}},
      {"disk.txt", "Hardware Class: disk", "0x4013", {}},
      {"floppy.txt", "Hardware Class: floppy", "Floppy Disk", {"/dev/fd0", "/dev/fd0"}},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(std::string(row.fText) + " " + row.fMarker);
    EXPECT_EQ(DeviceFilesIn(Sample(row.fText), row.fHeader, row.fMarker), row.fFiles);
  }
}

TEST(MediaTextsTest, HeaderMarkerAndFileAreOnLinesInThatOrder) {
  struct TRow {
    std::string fText;
    TLines fFiles;
  };
  TRow const rows[] = {
      {"", {}},
      {"\n\n\n", {}},
      {"H\nM\nDevice File: /dev/a\n", {"/dev/a"}},
      {"H\nM\nDevice File: /dev/a", {"/dev/a"}},                         // the last line without its newline
      {"  x H y\n  x M y\n  x Device File:/dev/a\n", {"/dev/a"}},        // anywhere in the line
      {"H\nM\nDevice File:   /dev/a \t\r\n", {"/dev/a"}},                // blanks around it
      {"H\nM\nDevice File: /dev/a (/dev/b)\n", {"/dev/a (/dev/b)"}},     //
      {"H\nM\nDevice File: /dev/a\nDevice File: /dev/b\n", {"/dev/a"}},  // one of each block
      {"H\nM\nDevice Files: /dev/a, /dev/b\nDevice File: /dev/c\n", {"/dev/c"}},
      {"H\nM\nDevice: x\nModel: y\n\nDevice File: /dev/a\n", {"/dev/a"}},
      {"M\nDevice File: /dev/a\n", {}},     // no header
      {"H\nDevice File: /dev/a\n", {}},     // no marker
      {"H\nM\n", {}},                       // no file
      {"M\nH\nDevice File: /dev/a\n", {}},  // the marker before the header
      {"H M\nDevice File: /dev/a\n", {}},   // on one line
      {"H\nM Device File: /dev/a\n", {}},   //
      {"H\nDevice File: /dev/a\nM\n", {}},  // the file before the marker
      {"H\nDevice File: /dev/a\n\nH\nM\nDevice File: /dev/b\n", {"/dev/b"}},
      {"H\nM\n\nH\nDevice File: /dev/b\n", {}},  // a marked block without file lends its mark to none
      {"H\nM\nDevice File: /dev/b\n\nH\nDevice File: /dev/c\n\nH\nM\nDevice File: /dev/a\n", {"/dev/b", "/dev/a"}},
      {"H\nM\nDevice File: /dev/a\nM\nDevice File: /dev/b\n", {"/dev/a"}},
      {"H\nM\nDevice File:\n", {""}},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fText);
    EXPECT_EQ(DeviceFilesIn(row.fText, "H", "M"), row.fFiles);
  }
}

TEST(MediaTextsTest, AnAliasIsCutOffAtTheFirstParenthesis) {
  struct TRow {
    char const *fText, *fName;
  };
  TRow const rows[] = {
      {"/dev/sr0 (/dev/sg1)", "/dev/sr0"}, {"/dev/sr0", "/dev/sr0"}, {"/dev/sr0(/dev/sg1) (x)", "/dev/sr0"},
      {"/dev/sr0   (", "/dev/sr0"},        {"(/dev/sg1)", ""},       {"", ""},
  };
  for (TRow const& row : rows) EXPECT_EQ(WithoutAlias(row.fText), row.fName) << row.fText;
}

// ---- ScsiAddressFrom ----

std::string TextOf(std::optional<TScsiAddress> const& address) {
  if (!address) return "none";
  std::ostringstream text;
  text << address->fHost << " " << address->fChannel << " " << address->fTarget << " " << address->fLun;
  return text.str();
}

TEST(MediaTextsTest, AScsiAddressIsFourNumbers) {
  struct TRow {
    char const *fText, *fAddress;
  };
  TRow const rows[] = {
      {"0:0:0:0", "0 0 0 0"},
      {"12:3:45:6", "12 3 45 6"},
      {"1:0:0:255", "1 0 0 255"},
      {"2147483647:0:0:0", "2147483647 0 0 0"},
      {"2147483648:0:0:0", "none"},
      {"", "none"},
      {"1", "none"},
      {"1:2:3", "none"},
      {"1:2:3:", "none"},
      {"1:2:3:4:", "none"},
      {"1:2:3:4:5", "none"},
      {"1:2:3:4 ", "none"},
      {" 1:2:3:4", "none"},
      {"1: 2:3:4", "none"},
      {"-1:2:3:4", "none"},
      {"+1:2:3:4", "none"},
      {"1:2:3:-4", "none"},
      {"1::3:4", "none"},
      {":1:2:3:4", "none"},
      {"1.2.3.4", "none"},
      {"a:b:c:d", "none"},
      {"1:2:3:x", "none"},
      {"/dev/sg0", "none"},
      {"[1:2:3:4]", "none"},
  };
  for (TRow const& row : rows) EXPECT_EQ(TextOf(ScsiAddressFrom(row.fText)), row.fAddress) << row.fText;
}

// ---- Lists ----

TEST(MediaTextsTest, TheListOfUsbDevicesIsSearchedByBusAndDevice) {
  std::string const list = Sample("usb-devices.txt");
  struct TRow {
    int fBus, fDevice;
    bool fIsThere;
  };
  TRow const rows[] = {{1, 1, true},  {1, 2, true},  {1, 3, true},  {2, 2, true},  {6, 2, true},
                       {2, 3, false}, {0, 1, false}, {7, 1, false}, {3, 21, false}};
  for (TRow const& row : rows) EXPECT_EQ(Lists(list, {row.fBus, row.fDevice}), row.fIsThere) << row.fBus << " " << row.fDevice;
}

TEST(MediaTextsTest, OnlyWholeNumbersOfOneTopologyLineCount) {
  struct TRow {
    char const* fList;
    bool fIsThere;
  };
  TRow const rows[] = {
      {"T:  Bus=02 Lev=01 Dev#=  3 Spd=480\n", true},
      {"T:  Bus=2 Dev#=3", true},
      {"T:  Bus=12 Lev=01 Dev#=  3\n", false},
      {"T:  Bus=02 Lev=01 Dev#= 13\n", false},
      {"T:  Bus=02 Lev=01 Dev#= 30\n", false},
      {"T:  Bus=02\nDev#=  3\n", false},
      {"T:  Bus=02 Dev#=  1\nT:  Bus=01 Dev#=  3\n", false},
      {"S:  Product=Bus=02 Dev#=  3\n", false},
      {"T:  Bus= Dev#=\n", false},
      {"T:  Bus=02 Dev#=", false},
      {"T:", false},
      {"", false},
  };
  for (TRow const& row : rows) EXPECT_EQ(Lists(row.fList, {2, 3}), row.fIsThere) << row.fList;
}

}  // namespace
}  // namespace NQRVZEP20
