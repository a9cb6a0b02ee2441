// SPDX-License-Identifier: Apache-2.0
#pragma once

// A simulated controller with sensors and events, read by zep remote --inventory and by ipmitool.

#include "tests/providers/controller/ControllerBytes.h"
#include "tests/system/ipmi/IpmiBed.h"
#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"

#include <gtest/gtest.h>

#include <optional>
#include <sstream>
#include <string>
#include <vector>

namespace NQRVZEP20 {

using TCells = std::vector<std::string>;

inline std::string Trimmed(std::string const& text) {
  std::size_t const begin = text.find_first_not_of(' ');
  return begin == std::string::npos ? "" : text.substr(begin, text.find_last_not_of(' ') + 1 - begin);
}

// The lines of a table, split at `separator`.
inline std::vector<TCells> RowsOf(std::string const& text, char separator) {
  std::vector<TCells> rows;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    std::istringstream cells(line);
    rows.emplace_back();
    for (std::string cell; std::getline(cells, cell, separator);) rows.back().push_back(Trimmed(cell));
  }
  return rows;
}

class InventoryTest : public testing::Test {
protected:
  void SetUp() override {
    NEEDS(HasIpmiBed(), kIpmiBedNeeds);
    NEEDS(std::system("command -v ipmitool >/dev/null") == 0, "ipmitool");
    EnterNetworkNamespace();
    for (char const* library : {"libipmiClient.so", "libController.nsp.so"})
      fZep.Add(library, TEST_LIB_DIR "/" + std::string(library));
    fSimulator.emplace(Settings());
    fSimulator->WaitUntilReady();
  }

  // Of a controller with sensors, events, FRU data and LAN parameters.
  TSimulator::TSettings Settings() const {
    TSimulator::TSettings settings;
    settings.fFru = FruImage();
    settings.fMore = SourcePath("tests/system/ipmi/sim/sensors.emu");
    settings.fHasLan = true;
    return settings;
  }

  // Three areas, and the identity at its place after them.
  std::string FruImage() const {
    std::string image = FruDevice();
    image.resize(1024, '\xFF');
    image.replace(0x1AC, 8, "1234AB7\0"s);
    image.replace(0x1CC, 8, "KQ12345\0"s);
    WriteFile(fDir.Path("fru"), image);
    return fDir.Path("fru");
  }

  zep::TRun Run(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), {"remote", "--user", "zepadmin"});
    return fZep.Run({arguments, {{"ZEP_BMC_PASSWORD", "zeppass1"}, {"XDG_CACHE_HOME", fDir.Path("cache")}}});
  }

  nlohmann::json Inventory() {
    zep::TRun const run = Run({"127.0.0.1", "--inventory", "--json"});
    EXPECT_EQ(run.fStatus, 0) << run.fErrors;
    zep::ExpectEnvelope(run.fOutput, 0, "zep remote");
    return nlohmann::json::parse(run.fOutput);
  }

  static nlohmann::json const& Instance(nlohmann::json const& document, std::string const& className, std::string const& property,
                                        std::string const& value) {
    static nlohmann::json const none;
    for (nlohmann::json const& instance : document["instances"])
      if (instance["class"] == className && instance["properties"][property]["value"] == value) return instance["properties"];
    ADD_FAILURE() << "no " << className << " with " << property << " " << value;
    return none;
  }

  // The output of ipmitool, which gets the password from its environment.
  std::string Ipmitool(std::string const& command) const {
    std::string const file = fDir.Path("ipmitool");
    std::string const line =
        "IPMI_PASSWORD=zeppass1 ipmitool -I lanplus -C 3 -H 127.0.0.1 -U zepadmin -E " + command + " >" + file + " 2>/dev/null";
    EXPECT_EQ(std::system(line.c_str()), 0) << command;
    return ReadFile(file);
  }

  TTempDir const fDir;
  zep::TInstallation fZep;
  std::optional<TSimulator> fSimulator;
};

}  // namespace NQRVZEP20
