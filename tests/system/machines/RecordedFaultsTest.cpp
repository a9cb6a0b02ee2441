// SPDX-License-Identifier: Apache-2.0

// Every fault that files of the kernel or answers of programs and controllers can show: planted in a recorded machine, it is
// found with its rule alone, and it is gone when mended. Before and after, the rule examines the healthy values.

#include "tests/system/machines/PlantedFaults.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <regex>

namespace NQRVZEP20::zep {
namespace {

using testing::IsEmpty;

using RecordedFaultsTest = TPlantedFaults;

TEST_F(RecordedFaultsTest, OfDisksAndFileSystems) {
  std::string const spare = R"("available_spare":0,"available_spare_threshold":0)";
  TFault const reallocated = [](std::string report) {
    std::string const none = R"("raw":{"value":0,)";
    return report.replace(report.find(none, report.find("Reallocated_Sector_Ct")), none.size(), R"("raw":{"value":51,)");
  };
  std::string const attribute = R"({"id":197,"name":"Current_Pending_Sector","raw":{"value":8,"string":"8"}},)";
  TFault const pending = Replaced(R"("table":[{"id":1,)", R"("table":[)" + attribute + R"({"id":1,)");
  TFaultRow const rows[] = {
      {"critical disk-failing",
       "replace it",
       {{kAnswers + "smartctl/sda", Replaced(R"("smart_status":{"passed":true)", R"("smart_status":{"passed":false)")}},
       "the disk sda reports that it is failing"},
      {"warning disk-failing",
       "air flow",
       {{kAnswers + "smartctl/nvme0n1", Replaced(R"("passed":true,"nvme":{"value":0})", R"("passed":false,"nvme":{"value":2})")},
        {kAnswers + "smartctl/nvme0n1", Replaced(R"("critical_warning":0)", R"("critical_warning":2)")}},
       "the disk nvme0n1 reports a temperature out of its range"},
      {"error disk-lost",
       "cable",
       {{"sys/class/block/sda/device/state", Content("offline\n")}},
       "the kernel cannot use the disk sda (offline)"},
      {"warning disk-worn",
       "Plan its replacement",
       {{kAnswers + "smartctl/nvme0n1", Replaced(R"("percentage_used":0)", R"("percentage_used":95)")}},
       "the disk nvme0n1 has used 95 % of its expected life"},
      {"error disk-worn",
       "replace it",
       {{kAnswers + "smartctl/nvme0n1", Replaced(spare, R"("available_spare":3,"available_spare_threshold":10)")}},
       "the disk nvme0n1 has only 3 % of its spare blocks left"},
      {"error disk-sectors",
       "smartctl -t long",
       {{kAnswers + "smartctl/sda", pending}},
       "the disk sda has unreadable sectors: 8"},
      {"error disk-sectors",
       "smartctl -t long",
       {{kAnswers + "smartctl/nvme0n1", Replaced(R"("media_errors":0)", R"("media_errors":3)")}},
       "the disk nvme0n1 has uncorrected errors: 3"},
      {"warning disk-sectors",
       "if it grows",
       {{kAnswers + "smartctl/sda", reallocated}},
       "the disk sda has replaced bad sectors: 51"},
      {"critical array-degraded",
       "mdadm --add",
       {{kArray + "degraded", Content("1\n")},
        {kArray + "dev-vda1/state", Content("faulty\n")},
        {kArray + "dev-vda1/slot", Content("none\n")}},
       "the RAID array md0 is degraded: 1 of 2 members is missing"},
      {"error array-degraded",
       "mdadm --add",
       {{kArray + "raid_disks", Content("3\n")}, {kArray + "degraded", Content("1\n")}},
       "the RAID array md0 is degraded: 1 of 3 members is missing"},
      {"warning array-degraded",
       "Wait until it is complete",
       {{kArray + "degraded", Content("1\n")}, {kArray + "sync_action", Content("recover\n")}},
       "the RAID array md0 is being rebuilt: 1 of 2 members is missing"},
      {"critical array-degraded",
       "mdadm --run",
       {{kArray + "array_state", Content("inactive\n")},
        {kArray + "level", Content("\n")},
        {kArray + "raid_disks", Content("0\n")},
        {kArray + "degraded", kRemoved},
        {kArray + "sync_action", kRemoved}},
       "the RAID array md0 does not run (inactive)"},
      {"critical array-degraded",
       "mdadm --assemble",
       {{kArray + "array_state", Content("broken\n")}, {kArray + "level", Content("raid0\n")}, {kArray + "degraded", kRemoved}},
       "the RAID array md0 is broken"},
      {"error file-system-full",
       "enlarge",
       {{kAnswers + "statvfs/data/values", Content("1024 1024 89361 60 50 25376 25364 255\n")}},
       "the file system on /data has less than 1 % free"},
      {"error file-system-inodes",
       "many small ones",
       {{kAnswers + "statvfs/data/values", Content("1024 1024 89361 68867 61772 25376 0 255\n")}},
       "the file system on /data has nearly no room for further files: 0 % of its inodes free"},
      {"error file-system-read-only",
       "fsck",
       {{"proc/self/mountinfo", Replaced("ext4 /dev/md0 rw", "ext4 /dev/md0 ro")}},
       "the file system on /data has become read-only"},
  };
  ExpectFoundAndGone(rows);
}

TEST_F(RecordedFaultsTest, OfPortsAndLinks) {
  constexpr std::size_t speed = 4, duplex = 8;  // in the answer of ethtool
  std::string const settings = kAnswers + "ethtool/eth1/linksettings";
  std::string const width8 = "8\n", rate8 = "8.0 GT/s PCIe\n", rate2 = "2.5 GT/s PCIe\n";
  TFaultRow const rows[] = {
      {"warning port-slow",
       "cable",
       {{settings, Patched(speed, Bytes({100, 0, 0, 0}))}},
       "the network port eth1 runs at 100 Mbit/s, although it can run at 1000"},
      {"warning port-half-duplex",
       "negotiate",
       {{settings, Patched(duplex, Bytes({0}))}},
       "the network port eth1 uses half duplex"},
      {"error bond-member",
       "cable",
       {{kEthernet + "bonding_slave/mii_status", Content("down\n")}},
       "the bond bond0 lacks its member eth1, which has no link"},
      {"warning pci-link",
       "riser",
       {{kCard + "max_link_width", Content(width8)}, {kCard + "current_link_width", Content("4\n")}},
       "the PCI Express link of 0000:01:00.0 has 4 of the 8 lanes that both ends have"},
      {"warning pci-link",
       "riser",
       {{kCard + "max_link_speed", Content(rate8)}, {kCard + "current_link_speed", Content(rate2)}},
       "the PCI Express link of 0000:01:00.0 runs at 2.5 GT/s, although both ends can run at 8 GT/s"},
      {"error pci-errors",
       "riser",
       {{kPort + "aer_dev_fatal", Replaced("TOTAL_ERR_FATAL 0", "TOTAL_ERR_FATAL 1")}},
       "the PCI Express device 0000:00:03.0 has had fatal errors since the start: 1"},
      {"warning pci-errors",
       "riser",
       {{kPort + "aer_dev_nonfatal", Replaced("TOTAL_ERR_NONFATAL 0", "TOTAL_ERR_NONFATAL 1")}},
       "the PCI Express device 0000:00:03.0 has had uncorrected errors since the start: 1"},
      {"warning pci-errors",
       "riser",
       {{kPort + "aer_dev_correctable", Replaced("TOTAL_ERR_COR 0", "TOTAL_ERR_COR 1001")}},
       "the PCI Express device 0000:00:03.0 has had corrected errors since the start: 1001"},
  };
  ExpectFoundAndGone(rows);
}

// Without the answers of the kernel's netlink, sysfs is read. The ports of the bond become ports of a bridge.
TEST_F(RecordedFaultsTest, OfPortsOfABridge) {
  fs::remove_all(Path(kAnswers + "netlink"));
  for (char const* bond : {"bond0", "bond0.10"}) fs::remove(Path("sys/class/net/" + std::string(bond)));
  for (char const* port : {"eth0", "eth1"}) {
    std::string const master = Path("sys/class/net/" + std::string(port) + "/master");
    fs::remove(master);
    fs::create_symlink("/sys/devices/virtual/net/br0", master);
  }
  TFaultRow const rows[] = {
      {"warning port-errors",
       "cable",
       {{kEthernet + "statistics/rx_packets", Content("100000\n")}, {kEthernet + "statistics/rx_errors", Content("10\n")}},
       "the network interface eth1 has had 10 errors in 100"},
      {"error port-unplugged",
       "cable",
       {{kEthernet + "operstate", Content("down\n")}, {kEthernet + "carrier", Content("0\n")}},
       "the network port eth1 is in use, but has no link"}};
  ExpectFoundAndGone(rows);
}

TEST_F(RecordedFaultsTest, OfSensorsAndMemory) {
  TFaultRow const rows[] = {
      {"error sensor-threshold", "air flow", {{kSensor + "temp1_input", Content("100850\n")}}},
      {"warning sensor-threshold", "air flow", {{kSensor + "temp1_input", Content("75850\n")}}},
      {"warning fan-stopped", "If a fan is connected", {{kSensor + "fan1_input", Content("0\n")}}},
      {"error fan-stopped", "Replace the fan", {{kSensor + "fan1_fault", Content("1\n")}}},
      {"error power-supply-lost", "cable", {{kSupply + "PSU2/online", Content("0\n")}}},
      {"critical memory-errors", "Replace the memory module", {{kModules + "dimm0/dimm_ue_count", Content("1\n")}}},
      {"warning memory-errors", "Watch the number", {{kModules + "dimm0/dimm_ce_count", Content("101\n")}}},
  };
  ExpectFoundAndGone(rows);
}

// Makes the second module one of the channel of the first, with other bytes at that offset of its SMBIOS structure. The strings
// of a structure follow its fields; the length of the fields is its second byte.
TFault OtherModule(std::size_t offset, std::string const& bytes) {
  return [offset, bytes](std::string table) {
    constexpr char type = 17;
    std::size_t const strings = table.find("DIMM 1");
    std::size_t start = strings - 2;
    while (table[start] != type || static_cast<std::uint8_t>(table[start + 1]) != strings - start) --start;
    table.replace(start + offset, bytes.size(), bytes);
    return Replaced("P0 channel 1", "P0 channel 0")(table);
  };
}

TFault OtherProcessor(std::string const& from, std::string const& to) {
  return [from, to](std::string const& text) {
    std::size_t const second = text.find("processor\t: 2");  // each has two cores
    EXPECT_NE(text.find(from, second), std::string::npos) << from;
    return text.substr(0, second) + std::regex_replace(text.substr(second), std::regex(from), to);
  };
}

TEST_F(RecordedFaultsTest, OfTheSystem) {
  std::string const unit = R"([{"unit":"backup.service","load":"loaded","active":"failed","sub":"failed","description":"b"}])";
  std::string const modules = "sys/firmware/dmi/tables/DMI";
  constexpr std::size_t size = 0x0C, memoryType = 0x12, memorySpeed = 0x15;  // in the structure of a module
  TFaultRow const rows[] = {
      {"warning processors-differ",
       "microcode",
       {{"proc/cpuinfo", OtherProcessor("0x1000065", "0x1000064")}},
       "the processors have different microcode (MicrocodeVersion: 0x1000064, 0x1000065)"},
      {"warning processors-differ",
       "same model and stepping",
       {{"proc/cpuinfo", OtherProcessor("stepping\t: 1", "stepping\t: 2")}},
       "the processors are of different kinds (Stepping: 1, 2)"},
      {"warning memory-differs",
       "same size",
       {{modules, OtherModule(size, Bytes({64}))}},
       "the memory modules of the channel P0 channel 0 do not match (Capacity: 134217728, 67108864)"},
      {"warning memory-differs",
       "same size, type",
       {{modules, OtherModule(memoryType, Bytes({0x18}))}},
       "the memory modules of the channel P0 channel 0 do not match (MemoryType: 24, 26)"},
      {"warning memory-differs",
       "type and speed",
       {{modules, OtherModule(memorySpeed, Bytes({0x60, 0x09}))}},
       "the memory modules of the channel P0 channel 0 do not match (MaxMemorySpeed: 2400, 3200)"},
      {"information processor-weakness",
       "Update the kernel",
       {{"sys/devices/system/cpu/vulnerabilities/meltdown", Content("Vulnerable\n")}},
       "the kernel mitigates some weaknesses of the processor incompletely or not at all: meltdown"},
      {"warning clock-synchronized",
       "time service",
       {{kAnswers + "adjtimex", Patched(kClockStatus, Bytes({0x40}))}},
       "the clock is not synchronised"},
      {"error kernel-taint",
       "journalctl -k",
       {{"proc/sys/kernel/tainted", Content("128\n")}},
       "the kernel has had an internal error (OOPS or BUG) since the start"},
      {"warning failed-units",
       "systemctl status",
       {{kAnswers + "systemctl/failed", Content(unit)}},
       "units of systemd have failed: backup.service"},
      {"warning out-of-memory",
       "MemoryMax",
       {{"dev/kmsg", Content("3,1,1000000,-;Memory cgroup out of memory: Killed process 158 (tail) total-vm:7048kB\n")}},
       "the kernel killed the process tail because its control group had reached its memory limit, 1 hour ago"},
      {"error hardware-errors",
       "management controller",
       {{"dev/kmsg", Content("2,1,1000000,-;{1}[Hardware Error]: event severity: fatal\n")}},
       "the kernel reports an error of the hardware, 1 hour ago"},
      {"error disk-errors",
       "smartctl",
       {{"dev/kmsg", Content("3,1,1000000,-;I/O error, dev sda, sector 8 op 0x1:(WRITE)\n")}},
       "the kernel reports an input or output error of the disk sda, 1 hour ago"},
  };
  ExpectFoundAndGone(rows);
}

// With the answers of a controller, recorded through /dev/ipmi0: a temperature (1), a fan (2) and a power supply (3). The
// readings and the empty event log are those of a healthy one.
TEST_F(RecordedFaultsTest, OfTheManagementController) {
  fs::copy(TestDataPath("controller/zep-answers/ipmi"), Path(kIpmi));
  WriteFile(Path(kIpmi + "0a40-"), Patched(2, Bytes({0, 0}))(ReadFile(Path(kIpmi + "0a40-"))));
  WriteFile(Path(kIpmi + "042d-01"), Bytes({0, 70, 0xC0, 0}));
  WriteFile(Path(kIpmi + "042d-02"), Bytes({0, 45, 0xC0, 0}));
  WriteFile(Path(kIpmi + "042d-03"), Bytes({0, 0, 0xC0, 1, 0}));
  WriteFile(Path(kIpmi + "0642-01"), Bytes({0, 1, 4, 1, 0, 0, 0, 0, 0, 0}));  // a LAN channel
  WriteFile(Path(kIpmi + "0644-0101"), Bytes({0, 2, 0x82, 0, 0x0F}));         // of two accounts, the first is disabled
  WriteFile(Path(kIpmi + "0644-0102"), Bytes({0, 2, 0x42, 0, 0x14}));
  WriteFile(Path(kIpmi + "0646-01"), Bytes({0}) + std::string(16, '\0'));
  WriteFile(Path(kIpmi + "0646-02"), Bytes({0}) + "support" + std::string(9, '\0'));
  std::string const removal = Bytes({0, 0xFF, 0xFF, 0, 0, 2, 0x23, 0x72, 3, 0x6B, 0x20, 0, 4, 8, 3, 0xEF, 0, 0xFF, 0xFF});
  std::string const memory = Bytes({0, 0xFF, 0xFF, 0, 0, 2, 0x23, 0x72, 3, 0x6B, 0x20, 0, 4, 0x0C, 9, 0x6F, 1, 0xFF, 0xFF});
  TFaultRow const rows[] = {
      {"error sensor-threshold", "air flow", {{kIpmi + "042d-01", Content(Bytes({0, 91, 0xC0, 0x18}))}}},
      {"error fan-stopped", "Replace the fan", {{kIpmi + "042d-02", Content(Bytes({0, 0, 0xC0, 0x07}))}}},
      {"error controller-part-failed", "replace it", {{kIpmi + "042d-03", Content(Bytes({0, 0, 0xC0, 3, 0}))}}},
      {"error controller-part-failed",
       "Insert it again",
       {{kIpmi + "042d-03", Content(Bytes({0, 0, 0xC0, 0, 0}))},
        {kIpmi + "0a40-", Patched(2, Bytes({1, 0}))},
        {kIpmi + "0a43-0000000000ff", Content(removal)}}},
      {"error event-log-critical",
       "ipmitool sel clear",
       {{kIpmi + "0a40-", Patched(2, Bytes({1, 0}))}, {kIpmi + "0a43-0000000000ff", Content(memory)}}},
      {"warning event-log-full", "ipmitool sel save", {{kIpmi + "0a40-", Patched(4, Bytes({0, 0}))}}},
      {"warning event-log-full",
       "ipmitool sel clear",
       {{kIpmi + "0a40-", Patched(14, Bytes({0x82}))}},
       "the controller's event log was full, and has lost events"},
      {"warning controller-clock", "ipmitool sel time set", {{kIpmi + "0a48-", Content(Bytes({0, 9, 0, 0, 0}))}}},
      {"information controller-account",
       "ipmitool user set password",
       {{kIpmi + "0646-02", Content(Bytes({0}) + "ADMIN" + std::string(11, '\0'))}}},
      {"warning controller-account", "ipmitool user disable", {{kIpmi + "0644-0101", Content(Bytes({0, 2, 0x42, 0, 0x14}))}}},
  };
  ExpectFoundAndGone(rows);
}

// The tables of this file have a row for each rule; problems of plug-ins have a test of their own.
TEST_F(RecordedFaultsTest, OfEveryRule) {
  std::string const tables = ReadFile(SourcePath("tests/system/machines/RecordedFaultsTest.cpp"));
  nlohmann::json const rules = Findings()["rules"];
  EXPECT_FALSE(rules.empty());
  for (nlohmann::json const& rule : rules) {
    std::string const id = rule["id"];
    if (id != "plug-in") {
      EXPECT_THAT(tables, testing::ContainsRegex("\\{\"(critical|error|warning|information) " + id + "\",")) << id;
    }
  }
}

// A plug-in reports problems only, so that the rule has nothing to examine without one.
TEST_F(RecordedFaultsTest, OfAPlugIn) {
  Write("batteries/BAT0/capacity", "97\n");
  TEnvironmentGuard const directory("EXAMPLE_BATTERIES", Path("batteries").c_str());
  std::vector<std::string> const options = {"--plugin", BATTERIES_PLUGIN};
  auto const problems = [&] { return Findings(options)["problems"]; };
  EXPECT_THAT(problems(), IsEmpty());
  Write("batteries/BAT0/capacity", "12\n");
  ExpectProblems({"warning battery-charge", "power supply", {}}, problems());
  Write("batteries/BAT0/capacity", "97\n");
  EXPECT_THAT(problems(), IsEmpty());
}

}  // namespace
}  // namespace NQRVZEP20::zep
