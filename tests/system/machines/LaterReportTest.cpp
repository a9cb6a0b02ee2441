// SPDX-License-Identifier: Apache-2.0

// Two reports of a machine with which nothing has happened between them.

#include "tests/collect/stored/StoredDocument.h"
#include "tests/system/machines/PlantedFaults.h"

#include <gmock/gmock.h>

namespace NQRVZEP20::zep {
namespace {

class LaterReportTest : public TPlantedFaults {
protected:
  TRun Run(std::vector<std::string> const& arguments) const {
    TCall call{arguments, {{"ZEP_ROOT", fMachine.Root()}, {"ZEP_SCSI_DEVICES", ""}}};
    call.fDirectory = fInstalled.Path("");
    return fInstalled.Run(call);
  }

  void Change(std::string const& path, TFault const& change) const { WriteFile(Path(path), change(ReadFile(Path(path)))); }

  // The minute that has passed.
  void LetTimePass() const {
    Change("proc/uptime", Content("7260.00 1.00\n"));
    Change("proc/loadavg", Content("0.10 0.40 0.30 2/140 1200\n"));
    Change("proc/meminfo", Replaced("723956 kB", "723000 kB"));
    Change("proc/meminfo", Replaced("679344 kB", "678000 kB"));
    Change("proc/cpuinfo", [](std::string const& processors) { return WithReplaced(processors, "2300.004", "1200.000"); });
    Change("sys/devices/system/node/node0/meminfo", Replaced("357580 kB", "357000 kB"));
    Change("dev/kmsg", [](std::string const& records) { return records + "6,99999,7230000000,-;device eth0 is used\n"; });
    Change(kSensor + "temp1_input", Content("51000\n"));
    Change(kSensor + "fan1_input", Content("910\n"));
    Change(kAnswers + "statvfs/values", Content("4096 4096 118048 92000 92000 118048 110900 255"));
    Change(kAnswers + "smartctl/sda",
           Replaced("522125343,\"string\":\"31 (Min/Max 31/31)", "522190880,\"string\":\"32 (Min/Max 31/32)"));
    Change(kAnswers + "smartctl/sda", Replaced(R"("temperature":{"current":31})", R"("temperature":{"current":32})"));
    Change(kAnswers + "smartctl/nvme0n1", Replaced(R"("data_units_read":235)", R"("data_units_read":236)"));
    Change(kAnswers + "smartctl/nvme0n1", Replaced(R"("data_units_written":64)", R"("data_units_written":65)"));
    Change(kAnswers + "smartctl/nvme0n1", Replaced(R"("power_on_time":{"hours":0)", R"("power_on_time":{"hours":1)"));
    Change(kAnswers + "smartctl/nvme0n1", Replaced(R"("temperature":{"current":50})", R"("temperature":{"current":51})"));
  }

  // "Class.Property" of each value that differs.
  static std::set<std::string> ChangedValues(nlohmann::json const& before, nlohmann::json const& after) {
    std::map<std::string, nlohmann::json> earlier;
    for (nlohmann::json const& instance : before["instances"]) earlier[instance["path"]] = instance["properties"];
    std::set<std::string> changed;
    for (nlohmann::json const& instance : after["instances"])
      for (auto const& [name, property] : instance["properties"].items())
        if (earlier[instance["path"]][name]["value"] != property["value"])
          changed.insert(instance["class"].get<std::string>() + "." + name);
    return changed;
  }
};

TEST_F(LaterReportTest, DiffersOnlyInWhatAlwaysChanges) {
  std::string const before = Run({"report", "--json"}).fOutput;
  WriteFile(fInstalled.Path("a.json"), before);
  LetTimePass();
  std::string const after = Run({"report", "--json"}).fOutput;
  WriteFile(fInstalled.Path("b.json"), after);
  EXPECT_THAT(ChangedValues(nlohmann::json::parse(before), nlohmann::json::parse(after)),
              testing::IsSupersetOf(
                  {"ZEP_RunningState.Uptime", "ZEP_RunningState.LoadOfOneMinute", "QRVSG_OperatingSystem.FreePhysicalMemory",
                   "CIM_Processor.CurrentClockSpeed", "ZEP_NUMANode.FreeMemory", "ZEP_KernelLog.CurrentNumberOfRecords",
                   "CIM_NumericSensor.CurrentReading", "CIM_UnixLocalFileSystem.AvailableSpace", "ZEP_DiskHealth.BytesWritten",
                   "ZEP_DiskHealth.PowerOnHours", "ZEP_DiskHealth.Temperature", "ZEP_SmartAttribute.RawText"}));
  TRun const run = Run({"diff", "a.json", "b.json"});
  EXPECT_EQ(run.fOutput, "no differences\n");
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(Run({"report", "--since", "a.json"}).fOutput, "no differences\n");
}

}  // namespace
}  // namespace NQRVZEP20::zep
