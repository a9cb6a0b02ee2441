// SPDX-License-Identifier: Apache-2.0
#include "providers/host/BootRecords.h"

#include "tests/Support.h"
#include "tests/providers/host/KernelTree.h"
#include "tests/providers/host/Structures.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

class BootRecordsTest : public testing::Test {
protected:
  std::string Boot(char const* property) {
    return PropertyOf(BootRecord(TMachineFiles(fRoot.Path()), {fStatus, "SMBIOS type 32"}, {fSystem, "SMBIOS type 1"}), property);
  }
  void Variable(std::string const& name, std::string const& bytes) {
    std::string const directory = fRoot.Path() + "/sys/firmware/efi/efivars/";
    std::filesystem::create_directories(directory);
    WriteFile(directory + name + "-8be4df61-93ca-11d2-aa0d-00e098032b8c", bytes);
  }

  TTempDir fRoot;
  TKernelTree fTree{fRoot.Path()};
  TSmbiosStructure fStatus = TStructureMaker(32, 0x0b).Byte(0x0a, 8).Make();
  TSmbiosStructure fSystem = TStructureMaker(1, 0x1b).Byte(0x18, 6).Make();
};

TEST_F(BootRecordsTest, SecureBootIsAVariableOfTheFirmware) {
  Variable("SecureBoot", std::string("\x06\0\0\0\x01", 5));
  Variable("SetupMode", std::string("\x06\0\0\0\0", 5));
  EXPECT_EQ(Boot("IsUEFI"), "boolean true");
  EXPECT_EQ(Boot("SecureBoot"), "boolean true");
  EXPECT_EQ(Boot("SecureBootSetupMode"), "boolean false");
  Variable("SecureBoot", "\x06");
  EXPECT_EQ(Boot("SecureBoot"),
            "boolean NULL unexpected-form: /sys/firmware/efi/efivars/SecureBoot-8be4df61-93ca-11d2-aa0d-00e098032b8c does not "
            "contain one byte");
}

TEST_F(BootRecordsTest, WithoutUefiThereIsNoSecureBoot) {
  EXPECT_EQ(Boot("IsUEFI"), "boolean NULL not-given: /sys/firmware does not exist");
  EXPECT_EQ(Boot("SecureBoot"), "boolean NULL not-given: /sys/firmware does not exist");
  fTree.Write("/sys/firmware/dmi/tables/DMI", "");
  EXPECT_EQ(Boot("IsUEFI"), "boolean false");
  EXPECT_EQ(Boot("SecureBoot"), "boolean NULL not-applicable: the machine was not started by UEFI firmware");
}

TEST_F(BootRecordsTest, TheCommandLineAndTheStatusAreThoseOfTheStart) {
  fTree.Write("/proc/cmdline", "BOOT_IMAGE=/vmlinuz root=/dev/sda1 quiet");
  EXPECT_EQ(Boot("KernelCommandLine"), "string BOOT_IMAGE=/vmlinuz root=/dev/sda1 quiet");
  EXPECT_EQ(Boot("FirmwareBootStatus"), "string System watchdog timer expired");
  fStatus = TStructureMaker(32, 0x0b).Byte(0x0a, 200).Make();
  EXPECT_EQ(Boot("FirmwareBootStatus"), "string Product-specific status 200");
  fStatus = TStructureMaker(32, 0x0b).Byte(0x0a, 9).Make();
  EXPECT_EQ(Boot("FirmwareBootStatus"), "string NULL unexpected-form: not in the expected form: boot status 9");
}

TEST_F(BootRecordsTest, TheWakeUpTypeIsAWordOfTheStandard) {
  EXPECT_EQ(Boot("WakeUpType"), "string Power Switch");
  fSystem = TStructureMaker(1, 0x1b).Byte(0x18, 2).Make();
  EXPECT_EQ(Boot("WakeUpType"), "string NULL not-given: the firmware reports it as unknown");
}

}  // namespace
}  // namespace NQRVZEP20
