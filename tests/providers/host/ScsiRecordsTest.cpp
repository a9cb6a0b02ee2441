// SPDX-License-Identifier: Apache-2.0
#include "providers/host/ScsiRecords.h"

#include "tests/providers/host/ScsiDirectory.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class ScsiRecordsTest : public testing::Test {
protected:
  // "DeviceID|DeviceType|VendorID|ProductID|ProductRevision" of each record, or the reason for a missing value.
  std::vector<std::string> Records() const {
    std::vector<std::string> texts;
    for (TRecord const& record : ScsiRecords({TMachineFiles("/"), fPath}, {"db1", "uname"})) {
      std::string text;
      for (TRecordProperty const& property : record.GetProperties())
        if (property.fName.find("System") == property.fName.npos && property.fName != "CreationClassName")
          text += (text.empty() ? "" : "|") +
                  (property.fValue.IsNull() ? "<" + property.fMissing.fReason + ">" : property.fValue.ToString());
      texts.push_back(text);
    }
    return texts;
  }

  TTempDir fDir;
  std::string fPath = fDir.Path("devices");
  TScsiDirectory fDevices{fPath};
};

TEST_F(ScsiRecordsTest, DevicesComeInTheOrderOfTheirAddresses) {
  for (char const* name : {"10:0:0:0", "2:0:0:1", "2:0:0:0", "2:0:10:0", "2:0:9:0", "2:1:0:0", "0:0:0:0"})
    fDevices.Add(name, "0", "V", "M", "R");
  EXPECT_THAT(Records(), ElementsAre("0:0:0:0|Direct Access Device|V|M|R", "2:0:0:0|Direct Access Device|V|M|R",
                                     "2:0:0:1|Direct Access Device|V|M|R", "2:0:9:0|Direct Access Device|V|M|R",
                                     "2:0:10:0|Direct Access Device|V|M|R", "2:1:0:0|Direct Access Device|V|M|R",
                                     "10:0:0:0|Direct Access Device|V|M|R"));
}

TEST_F(ScsiRecordsTest, HostsAndTargetsAreNotDevices) {
  for (char const* name : {"host0", "target0:0:0", "0:0:0", "0:0:0:0:0", "0:0:0:0x", "x0:0:0:0"})
    fDevices.Add(name, "0", "V", "M", "R");
  EXPECT_THAT(Records(), IsEmpty());
}

TEST_F(ScsiRecordsTest, EveryTypeHasItsName) {
  struct TRow {
    char const *fType, *fName;
  };
  TRow const rows[] = {
      {"0", "Direct Access Device"},
      {"1", "Sequential Access Device"},
      {"2", "Printer Device"},
      {"3", "Processor Device"},
      {"4", "Write Once Device"},
      {"5", "CD-ROM Device"},
      {"6", "Scanner Device"},
      {"7", "Optical Memory Device"},
      {"8", "Medium Changer Device"},
      {"9", "Communications Device"},
      {"10", "Graphic Arts Device"},
      {"11", "Graphic Arts Device"},
      {"12", "Storage Array Controller Device"},
      {"13", "Enclosure Services Device"},
      {"14", "Simplified Direct Access Device"},
      {"15", "Optical Card Device"},
      {"16", "Unknown Device, type 16"},
      {"31", "Unknown Device, type 31"},
      {"32", "<\"32\" is not a SCSI device type>"},
      {"x", "<\"x\" is not a SCSI device type>"},
      {"-1", "<\"-1\" is not a SCSI device type>"},
  };
  for (TRow const& row : rows) {
    fDevices.Add("0:0:0:0", row.fType, "V", "M", "R");
    EXPECT_THAT(Records(), ElementsAre(std::string("0:0:0:0|") + row.fName + "|V|M|R")) << row.fType;
  }
}

TEST_F(ScsiRecordsTest, PaddingBlanksAreRemoved) {
  fDevices.Add("0:0:0:0", "5", "QEMU    ", "  QEMU CD-ROM   ", "2.5+");
  EXPECT_THAT(Records(), ElementsAre("0:0:0:0|CD-ROM Device|QEMU|QEMU CD-ROM|2.5+"));
}

TEST_F(ScsiRecordsTest, AMissingValueOfADeviceHasAReason) {
  fDevices.Add("0:0:0:0", "0", "        ", "M", "R");
  std::filesystem::remove(fPath + "/0:0:0:0/rev");
  EXPECT_THAT(Records(), ElementsAre("0:0:0:0|Direct Access Device|<the device reports only blanks>|M|<" + fPath +
                                     "/0:0:0:0/rev does not exist>"));
}

TEST_F(ScsiRecordsTest, ADeviceThatIsRemovedMeanwhileIsOmitted) {
  fDevices.Add("0:0:0:0", "0", "V", "M", "R");
  std::filesystem::create_directory_symlink("nowhere", fPath + "/1:0:0:0");
  EXPECT_THAT(Records(), ElementsAre("0:0:0:0|Direct Access Device|V|M|R"));
}

TEST_F(ScsiRecordsTest, WithoutTheDirectoryThereAreNoDevices) {
  std::filesystem::remove(fPath);
  EXPECT_THAT(Records(), IsEmpty());
}

TEST_F(ScsiRecordsTest, TheEnvironmentMayNameAnotherDirectory) {
  TEnvironmentGuard const named("ZEP_SCSI_DEVICES", fPath.c_str());
  EXPECT_EQ(ScsiDirectory(TMachineFiles("/")).fPath, fPath);
  TEnvironmentGuard const empty("ZEP_SCSI_DEVICES", "");
  EXPECT_EQ(ScsiDirectory(TMachineFiles("/")).fPath, "/sys/bus/scsi/devices");
  TEnvironmentGuard const unset("ZEP_SCSI_DEVICES", nullptr);
  EXPECT_EQ(ScsiDirectory(TMachineFiles("/")).fPath, "/sys/bus/scsi/devices");
}

}  // namespace
}  // namespace NQRVZEP20
