// SPDX-License-Identifier: Apache-2.0
#pragma once

// A recorded machine in which faults are planted, one after the other. It and its plug-ins belong to the test.

#include "tests/Machines.h"
#include "tests/providers/controller/ControllerBytes.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20::zep {

// Returns the content of a file with the fault; an empty function removes the file.
using TFault = std::function<std::string(std::string const& content)>;
inline TFault const kRemoved;

inline TFault Content(std::string const& content) {
  return [content](std::string const&) { return content; };
}

inline TFault Replaced(std::string const& from, std::string const& to) {
  return [from, to](std::string text) {
    std::size_t const at = text.rfind(from);
    EXPECT_NE(at, std::string::npos) << from;
    return at == std::string::npos ? text : text.replace(at, from.size(), to);
  };
}

inline TFault Patched(std::size_t offset, std::string const& bytes) {
  return [offset, bytes](std::string content) { return content.replace(offset, bytes.size(), bytes); };
}

struct TFaultRow {
  char const* fProblem;  // severity and rule
  char const* fRemedy;   // a part of it
  std::vector<std::pair<std::string, TFault>> fChanges;
  char const* fReason = "";  // a part of it
};

inline std::string const kPort = "sys/devices/pci0000:00/0000:00:03.0/", kCard = kPort + "0000:01:00.0/";
inline std::string const kDisk = kCard + "0000:02:00.0/0000:03:00.0/", kSensor = kDisk + "nvme/nvme0/hwmon0/";
inline std::string const kEthernet = kCard + "0000:02:01.0/0000:04:00.0/net/eth1/";
inline std::string const kSupply = "sys/class/power_supply/", kModules = "sys/devices/system/edac/mc/mc0/";
inline std::string const kArray = "sys/devices/virtual/block/md0/md/";
inline std::string const kAnswers = "zep-answers/", kIpmi = kAnswers + "ipmi/";
constexpr std::size_t kClockStatus = 40;  // in the structure of adjtimex

class TPlantedFaults : public testing::Test {
protected:
  TPlantedFaults() {
    for (char const* library :
         {"libDevices.nsp.so", "libNetwork.nsp.so", "libStorage.nsp.so", "libSensors.nsp.so", "libController.nsp.so"})
      fInstalled.Add(library, std::string(TEST_LIB_DIR "/") + library);
    MakeHealthy();
  }

  // The recorded machine has no errors to count, no fan, power supply or time service, and it has just started.
  void MakeHealthy() const {
    for (char const* supply : {"PSU1/", "PSU2/"}) {
      Write(kSupply + supply + "type", "Mains\n");
      Write(kSupply + supply + "online", "1\n");
    }
    Write(kSensor + "fan1_input", "900\n");
    Write(kSensor + "fan1_min", "500\n");
    Write(kSensor + "fan1_fault", "0\n");
    Write(kModules + "dimm0/dimm_label", "DIMM_A1\n");
    for (char const* count : {"ce", "ue"}) Write(kModules + "dimm0/dimm_" + count + "_count", "0\n");
    Write("dev/kmsg", ReadFile(TestDataPath("kmsg/healthy")));
    Write("proc/uptime", "7200.00 1.00\n");
    Write(kAnswers + "systemctl/failed", "[]\n");
    Write(kAnswers + "adjtimex", Patched(kClockStatus, Bytes({0}))(ReadFile(Path(kAnswers + "adjtimex"))));
  }

  nlohmann::json Findings(std::vector<std::string> const& options = {}) const {
    TCall call{{"report", "--json", "--plugin-timeout", "60"}, {{"ZEP_ROOT", fMachine.Root()}}};
    call.fArguments.insert(call.fArguments.end(), options.begin(), options.end());
    call.fOutputFile = fInstalled.Path("document");
    fInstalled.Run(call);
    return nlohmann::json::parse(ReadFile(call.fOutputFile))["findings"];
  }

  std::string Path(std::string const& path) const { return fMachine.Root() + "/" + path; }

  void Write(std::string const& path, std::string const& content) const {
    fs::create_directories(fs::path(Path(path)).parent_path());
    WriteFile(Path(path), content);
  }

  // Each fault is mended before the next is planted, so that its problem would be found beside that of the next.
  template <std::size_t N>
  void ExpectFoundAndGone(TFaultRow const (&rows)[N]) const {
    ExpectFine(rows);
    for (TFaultRow const& row : rows) ExpectFound(row);
    ExpectFine(rows);
  }

  // Without a fault, the rules of the rows have examined something, and found nothing.
  template <std::size_t N>
  void ExpectFine(TFaultRow const (&rows)[N]) const {
    nlohmann::json const findings = Findings();
    EXPECT_THAT(findings["problems"], testing::IsEmpty()) << findings["problems"];
    std::set<std::string> fine;
    for (nlohmann::json const& rule : findings["rules"])
      if (rule["outcome"] == "fine" && rule["examined"] > 0) fine.insert(rule["id"]);
    for (TFaultRow const& row : rows) EXPECT_EQ(fine.count(std::strchr(row.fProblem, ' ') + 1), 1U) << row.fProblem;
  }

  void ExpectFound(TFaultRow const& row) const {
    SCOPED_TRACE(row.fProblem);
    std::map<std::string, std::string> healthy;
    for (auto const& [path, fault] : row.fChanges) {
      ASSERT_TRUE(fs::exists(Path(path))) << path;
      std::string const content = ReadFile(Path(path));
      healthy.try_emplace(path, content);
      if (fault)
        WriteFile(Path(path), fault(content));
      else
        fs::remove(Path(path));
    }
    ExpectProblems(row, Findings()["problems"]);
    for (auto const& [path, content] : healthy) WriteFile(Path(path), content);
  }

  static void ExpectProblems(TFaultRow const& row, nlohmann::json const& problems) {
    EXPECT_THAT(problems, testing::Not(testing::IsEmpty()));
    for (nlohmann::json const& problem : problems) {
      EXPECT_EQ(problem["severity"].get<std::string>() + " " + problem["rule"].get<std::string>(), row.fProblem);
      EXPECT_THAT(problem["remedy"].get<std::string>(), testing::HasSubstr(row.fRemedy));
      EXPECT_THAT(problem["reason"].get<std::string>(), testing::HasSubstr(row.fReason));
    }
  }

  TInstallation fInstalled;
  TRecordedMachine fMachine{"server"};
};

}  // namespace NQRVZEP20::zep
