// SPDX-License-Identifier: Apache-2.0

// zep report, run as users run it.

#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

namespace NQRVZEP20::zep {
namespace {

using testing::AllOf;
using testing::ElementsAre;
using testing::EndsWith;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

// The rows of one table of the report, each a vector of cells. The lines of a cell are joined with blanks. `widths` are the
// widths of the columns.
std::vector<std::vector<std::string>> RowsOf(std::string const& text, std::string const& title,
                                             std::vector<std::size_t> const& widths) {
  std::vector<std::vector<std::string>> rows;
  bool isInside = false;
  for (std::string const& line : LinesOf(text)) {
    if (!isInside) {
      isInside = line.compare(0, title.size(), title) == 0;
      continue;
    }
    if (line.empty()) break;
    std::vector<std::string> cells;
    std::size_t start = 0;
    for (std::size_t width : widths) {
      std::string cell = start < line.size() ? line.substr(start, width) : "";
      cell.erase(cell.find_last_not_of(' ') + 1);
      cells.push_back(cell);
      start += width + 2;
    }
    if (!cells[0].empty()) {
      rows.push_back(cells);
      continue;
    }
    for (std::size_t at = 1; at < cells.size(); ++at)
      if (!cells[at].empty()) rows.back()[at] += " " + cells[at];
  }
  return rows;
}

std::vector<std::vector<std::string>> ValueRowsOf(std::string const& text, std::string const& title) {
  return RowsOf(text, title, {15, 36, 25});
}
std::vector<std::vector<std::string>> PlugInRowsOf(std::string const& text, std::string const& title = "Plug-in") {
  return RowsOf(text, title, {15, 10, 51});
}

std::string WithoutBlanks(std::string text) {
  text.erase(std::remove(text.begin(), text.end(), ' '), text.end());
  return text;
}

// The value of a row of the text, or "no such row".
std::string ValueIn(std::string const& text, std::string const& label) {
  for (char const* title : {"Identity", "Details"})
    for (auto const& row : ValueRowsOf(text, title))
      if (row[0] == label) return row[1];
  return "no such row";
}

// The text that the report for people shows for an entry of the document.
std::string ValueTextOf(nlohmann::json const& entry) {
  if (entry["value"].is_null())
    return (entry["code"] == "not-applicable" ? "none: " : "unknown: ") + entry["reason"].get<std::string>();
  return entry["value"].get<std::string>() + (entry.contains("note") ? " (" + entry["note"].get<std::string>() + ")" : "");
}

class ReportTest : public testing::Test {
protected:
  TRun Report(std::string const& table, std::vector<std::string> const& options = {}) {
    return Run(options, {{"ZEP_SMBIOS_TABLE", table}});
  }
  TRun Run(std::vector<std::string> const& options, std::map<std::string, std::string> environment) {
    TCall call;
    call.fArguments = {"report"};
    call.fArguments.insert(call.fArguments.end(), options.begin(), options.end());
    call.fEnvironment = std::move(environment);
    call.fEnvironment["ZEP_HOST_NAME"] = "db1";
    return fZep.Run(call);
  }

  // Adds the test provider, with that behaviour.
  TRun RunWithTestProvider(std::string const& behaviour, std::vector<std::string> const& options = {}) {
    fZep.Add("libTest.nsp.so", TEST_PROVIDER);
    return Run(options, {{"ZEP_SMBIOS_TABLE", RealTablePath("full")}, {"ZEP_TEST_PROVIDER", behaviour}});
  }

  TInstallation fZep;
};

// ---- Identity and details ----

TEST_F(ReportTest, TheMachineOfEachRealTableIsReported) {
  struct TRow {
    char const *fTable, *fMachine;
    int fStatus;
  } const rows[] = {
      {"full", "db1: Server Q100, type 1234, model AB7, serial number KQ12345", 0},
      {"bare7", "db1: 1234AB7, type 1234, model AB7, serial number KQ12345", 0},
      {"eight", "db1: 1234AB78, no machine type and model, serial number KQ12345", 0},
      {"no-serial", "db1: Server, type 5678, model XY1, serial number unknown", 2},
      {"two-dashes", "db1: Rack-Server Q200, type 5678, model XY1, serial number KQ 99", 0},
      {"qemu-own", "db1: Standard PC (i440FX + PIIX, 1996), no machine type and model, serial number unknown", 2},
      {"entry64", "db1: Server Q100, type 1234, model AB7, serial number KQ12345", 0},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fTable);
    TRun const run = Report(RealTablePath(row.fTable));
    EXPECT_EQ(run.fStatus, row.fStatus);
    EXPECT_EQ(run.fErrors, "");
    auto const lines = LinesOf(run.fOutput);
    ASSERT_GT(lines.size(), 3u);
    EXPECT_EQ(lines[0], row.fMachine);
    EXPECT_THAT(lines[1], AllOf(StartsWith("Operating system: "), HasSubstr(", Linux ")));
    EXPECT_EQ(lines[2], "SMBIOS tables read from the file " + RealTablePath(row.fTable) + " (ZEP_SMBIOS_TABLE)");
  }
}

TEST_F(ReportTest, EachRowHasItsValueOrItsReason) {
  struct TRow {
    char const *fTable, *fLabel, *fValue;
  } const rows[] = {
      {"full", "Host name", "db1"},
      {"full", "Product name", "Server Q100 -[1234AB7]-"},
      {"full", "Machine type", "1234"},
      {"full", "Model", "AB7"},
      {"full", "Serial number", "KQ12345"},
      {"full", "OS type", "Linux"},
      {"full", "zepcore version", TEST_VERSION},
      {"full", "zepcore build", TEST_BUILD_ID},
      {"full", "Manufacturer", "Example Works"},
      {"full", "UUID", "unknown: not set by the firmware (all zeros)"},
      {"full", "BIOS version", "-[ABE123CUS-1.10]-"},
      {"full", "BIOS date", "unknown: not given by the firmware"},
      {"full", "Chassis", "Other"},
      {"full", "Processors", "1 x pc-i440fx-7.2, 1 core"},
      {"full", "Memory", "512 MiB in 1 module"},
      {"full", "Architecture", "x86_64"},
      {"eight", "Machine type", "none: the product name has no machine type and model in \"-[...]-\""},
      {"eight", "Model", "none: the product name has no machine type and model in \"-[...]-\""},
      {"no-serial", "Serial number", "unknown: not given by the firmware"},
      {"two-dashes", "Serial number", "KQ 99 (not in the collector's own form: 7 letters and digits)"},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(ValueIn(Report(RealTablePath(row.fTable)).fOutput, row.fLabel), row.fValue) << row.fTable;
}

TEST_F(ReportTest, AProductNameWithoutModelIsReportedAsSuch) {
  TRun const run = Report(fZep.Table(SystemInformation("Server X1-[1234]-", "KQ12345") + EndOfTable()));
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(ValueIn(run.fOutput, "Machine type"), "1234");
  EXPECT_EQ(ValueIn(run.fOutput, "Model"), "unknown: the product name contains only the machine type");
  EXPECT_EQ(LinesOf(run.fOutput)[0], "db1: Server X1, type 1234, model unknown, serial number KQ12345");
}

// The forms of serial numbers that the firmware of many manufacturers uses; the texts are invented.
TEST_F(ReportTest, SerialNumbersOfAllManufacturersAreShownAndCompleteTheIdentity) {
  std::string const longest = "XVM-42 1f 9a 3c 5d 7e 80 21-b3 c4 d5 e6 f7 08 19 2a 3b";
  ASSERT_EQ(longest.size(), 54u);
  struct TRow {
    std::string fProductName, fSerialNumber, fShownSerialNumber;
    bool fIsOfOwnForm;
  } const rows[] = {
      {"Rackhost R5200", "E09626824801435", "E09626824801435", false},
      {"Rackhost R5200 Gen3", "9000116105", "9000116105", false},
      {"Node 7 (2U)", "7F6K2L9Q", "7F6K2L9Q", false},
      {"Workcenter T-20", "SN/2231-07.A     ", "SN/2231-07.A", false},
      {"Storbox 12G", "\x01S400001X9912345\r\n", "S400001X9912345", false},
      {"Storbox 12G", "S400001X9912345 \t ", "S400001X9912345", false},
      {"Virtual Machine 7.1", longest, longest, false},
      {"Blade [half height]", "..QX731..ZZ09912.", "..QX731..ZZ09912.", false},
      {"Minibox-5", "5", "5", false},
      {"Minibox, 5 -", "KQ1234-", "KQ1234-", false},
      {"All Series", "  M80-4B014702119  ", "M80-4B014702119", false},
      {"Tower P110", " KQ12345 ", "KQ12345", true},
      {"Tower P110", "KQ12345", "KQ12345", true},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fSerialNumber);
    std::string const table = fZep.Table(SystemInformation(row.fProductName, row.fSerialNumber) + EndOfTable());
    std::string const note = "not in the collector's own form: 7 letters and digits";
    TRun const text = Report(table);
    EXPECT_EQ(text.fStatus, 0);
    EXPECT_EQ(LinesOf(text.fOutput)[0],
              "db1: " + row.fProductName + ", no machine type and model, serial number " + row.fShownSerialNumber);
    EXPECT_EQ(WithoutBlanks(ValueIn(text.fOutput, "Serial number")),
              WithoutBlanks(row.fShownSerialNumber + (row.fIsOfOwnForm ? "" : " (" + note + ")")));

    TRun const json = Report(table, {"--json"});
    EXPECT_EQ(json.fStatus, 0);
    auto const document = JsonOf(json);
    EXPECT_EQ(document["status"], "complete");
    auto const& serialNumber = document["identity"]["serialNumber"];
    EXPECT_EQ(serialNumber["value"], row.fShownSerialNumber);
    EXPECT_EQ(serialNumber.value("note", ""), row.fIsOfOwnForm ? "" : note);
    EXPECT_FALSE(serialNumber.contains("code"));
    for (char const* key : {"machineType", "model"}) {
      EXPECT_TRUE(document["identity"][key]["value"].is_null());
      EXPECT_EQ(document["identity"][key]["code"], "not-applicable");
      EXPECT_EQ(document["identity"][key]["reason"], "the product name has no machine type and model in \"-[...]-\"");
      EXPECT_EQ(document["identity"][key]["source"], "SMBIOS type 1 (file)");
    }
  }
}

TEST_F(ReportTest, ASerialNumberOfAnotherFormCompletesTheIdentity) {
  TRun const run = Report(fZep.Table(SystemInformation("Server Q100 -[1234AB7]-", "9000116105") + EndOfTable()));
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(LinesOf(run.fOutput)[0], "db1: Server Q100, type 1234, model AB7, serial number 9000116105");
}

TEST_F(ReportTest, OnlyAProductNameWithoutBracketsHasNoTypeAndModel) {
  struct TRow {
    char const *fProductName, *fMachine, *fTypeCode, *fModelCode;  // the code is null for a value
    int fStatus;
  } const rows[] = {
      {"Server Q100 -[1234]-", "Server Q100, type 1234, model unknown", nullptr, "not-given", 2},
      {"Server Q100 -[12]-", "Server Q100, type unknown, model unknown", "unexpected-form", "unexpected-form", 2},
      {"Server Q100 -[1234AB78]-", "Server Q100, type unknown, model unknown", "unexpected-form", "unexpected-form", 2},
      {"1234", "1234, type 1234, no model", nullptr, "not-applicable", 0},
      {"1234AB7", "1234AB7, type 1234, model AB7", nullptr, nullptr, 0},
      {"Rack -[ 2U", "Rack -[ 2U, no machine type and model", "not-applicable", "not-applicable", 0},
      {"]- Rack", "]- Rack, no machine type and model", "not-applicable", "not-applicable", 0},
      {"None", "unknown product, type unknown, model unknown", "placeholder", "placeholder", 2},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fProductName);
    std::string const table = fZep.Table(SystemInformation(row.fProductName, "KQ12345") + EndOfTable());
    TRun const run = Report(table, {"--json"});
    EXPECT_EQ(run.fStatus, row.fStatus);
    auto const document = JsonOf(run);
    EXPECT_EQ(document["head"][0], "db1: " + std::string(row.fMachine) + ", serial number KQ12345");
    for (auto const& [key, code] : {std::pair("machineType", row.fTypeCode), std::pair("model", row.fModelCode)}) {
      auto const& entry = document["identity"][key];
      EXPECT_EQ(entry.value("code", ""), code != nullptr ? code : "") << key;
      EXPECT_EQ(entry["value"].is_null(), code != nullptr) << key;
    }
  }
}

TEST_F(ReportTest, PlaceholdersOfTheFirmwareAreReportedAsSuch) {
  TRun const run = Report(fZep.Table(SystemInformation("To Be Filled By O.E.M.", "System Serial Number") + EndOfTable()));
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(ValueIn(run.fOutput, "Product name"), "unknown: placeholder text of the firmware: \"To Be Filled By O.E.M.\"");
  EXPECT_EQ(ValueIn(run.fOutput, "Machine type"), "unknown: placeholder text of the firmware: \"To Be Filled By O.E.M.\"");
  EXPECT_EQ(ValueIn(run.fOutput, "Serial number"), "unknown: placeholder text of the firmware: \"System Serial Number\"");
}

TEST_F(ReportTest, ASerialNumberThatWasNeverWrittenIsMissing) {
  struct TRow {
    char const *fSerialNumber, *fCode, *fShown;
  } const rows[] = {
      {"\xff\xff\xff\xff\xff\xff\xff ", "not-given", "unknown: not programmed in the firmware's table (0xFF)"},
      {" - ", "placeholder", "unknown: placeholder text of the firmware: \" - \""},
  };
  for (TRow const& row : rows) {
    std::string const table = fZep.Table(SystemInformation("Rackhost R5200", row.fSerialNumber) + EndOfTable());
    EXPECT_EQ(JsonOf(Report(table, {"--json"}))["identity"]["serialNumber"]["code"], row.fCode);
    EXPECT_EQ(WithoutBlanks(ValueIn(Report(table).fOutput, "Serial number")), WithoutBlanks(row.fShown));
  }
}

TEST_F(ReportTest, TwoKindsOfProcessorAndModulesOfUnknownSizeAreDistinguished) {
  std::string const processor =
      "\0\3\1\0"s + std::string(8, '\0') + "\1"s + std::string(7, '\0') + "\x41"s + std::string(23, '\0');
  std::string const module = std::string(8, '\0') + "\0\2"s + std::string(20, '\0');
  std::string const unknownModule = std::string(8, '\0') + "\xff\xff"s + std::string(20, '\0');
  TRun const run = Report(fZep.Table(Structure(4, processor, {"Kind B"}) + Structure(4, processor, {"Kind A"}) +
                                     Structure(4, processor, {"Kind A"}) + Structure(17, module) + Structure(17, unknownModule) +
                                     EndOfTable()));
  EXPECT_EQ(ValueIn(run.fOutput, "Processors"), "2 x Kind A, 1 x Kind B");
  EXPECT_EQ(ValueIn(run.fOutput, "Memory"), "512 MiB in 2 modules, 1 of them of unknown size");
}

// ---- Reasons for missing tables ----

TEST_F(ReportTest, AnUnreadableTableFileHasAReason) {
  TRun const missing = Report(fZep.Path("nothing"));
  EXPECT_EQ(missing.fStatus, 2);
  EXPECT_EQ(LinesOf(missing.fOutput)[0],
            "db1: not identified: the SMBIOS table file " + fZep.Path("nothing") + " does not exist");

  TRun const garbage = Report(fZep.Table("_SM_ and no more"));
  EXPECT_EQ(garbage.fStatus, 2);
  EXPECT_THAT(LinesOf(garbage.fOutput)[0], EndsWith(" does not contain an SMBIOS table"));
}

TEST_F(ReportTest, ATableFileOfAnotherUserHasAReason) {
  std::string const table = fZep.Table(RealTable("full"));
  fs::permissions(table, fs::perms::owner_all);
  if (::geteuid() != 0) fs::permissions(table, fs::perms::none);
  TCall call;
  call.fArguments = {"report"};
  call.fEnvironment = {{"ZEP_SMBIOS_TABLE", table}, {"ZEP_HOST_NAME", "db1"}};
  call.fAsNobody = true;
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 2);
  ASSERT_FALSE(run.fOutput.empty());
  EXPECT_EQ(LinesOf(run.fOutput)[0],
            "db1: not identified: the SMBIOS table file " + table + " cannot be read: this user lacks the permission");
}

TEST_F(ReportTest, UnreadableSystemTablesHaveAReason) {
  fZep.Add("libsmbios.so", FAKE_SMBIOS);
  struct TRow {
    char const *fBehaviour, *fMachine, *fCode;
  } const rows[] = {
      {"is missing its file", "db1: not identified: the system exports no SMBIOS tables", "no-smbios"},
      {"is denied access", "db1: not identified: only root can read the SMBIOS tables", "needs-root"},
      {"fails", "db1: not identified: the system's SMBIOS tables cannot be read", "unreadable"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fBehaviour);
    TRun const run = Run({}, {{"FAKE_SMBIOS", row.fBehaviour}});
    EXPECT_EQ(run.fStatus, 2);
    EXPECT_EQ(LinesOf(run.fOutput)[0], row.fMachine);
    auto const identity = JsonOf(Run({"--json"}, {{"FAKE_SMBIOS", row.fBehaviour}}))["identity"];
    for (char const* key : {"productName", "machineType", "model", "serialNumber"}) {
      EXPECT_EQ(identity[key]["code"], row.fCode) << key;
      EXPECT_TRUE(identity[key]["value"].is_null()) << key;
    }
    EXPECT_EQ(identity["hostName"]["value"], "db1");
  }
}

TEST_F(ReportTest, WithoutTheSmbiosLibraryTheLinkersReasonIsReported) {
  fZep.Remove("libsmbios.so");
  TRun const run = Run({}, {});
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_THAT(LinesOf(run.fOutput)[0], AllOf(StartsWith("db1: not identified: the SMBIOS library cannot be loaded: libsmbios.so"),
                                             HasSubstr("No such file")));
}

// ---- JSON ----

TEST_F(ReportTest, JsonAgreesWithTheText) {
  for (std::string const& table : kRealTables) {
    SCOPED_TRACE(table);
    TRun const text = Report(RealTablePath(table)), json = Report(RealTablePath(table), {"--json"});
    EXPECT_EQ(json.fStatus, text.fStatus);
    EXPECT_EQ(json.fErrors, "");
    auto const document = JsonOf(json);
    EXPECT_EQ(document["version"], 2);
    EXPECT_EQ(document["document"], "zep report");
    EXPECT_EQ(document["sample"], false);
    EXPECT_EQ(document["exitStatus"], text.fStatus);
    EXPECT_EQ(document["status"], text.fStatus == 0 ? "complete" : "partial");
    EXPECT_EQ(document["smbiosTableFile"], RealTablePath(table));
    EXPECT_EQ(document["head"][0], LinesOf(text.fOutput)[0]);
    EXPECT_EQ(document["head"][1], LinesOf(text.fOutput)[1]);

    std::size_t compared = 0;
    for (auto const& [key, title] : std::map<std::string, std::string>{{"identity", "Identity"}, {"details", "Details"}}) {
      auto const rows = ValueRowsOf(text.fOutput, title);
      ASSERT_EQ(rows.size(), document[key].size());
      for (auto const& entry : document[key]) {
        auto const row = std::find_if(rows.begin(), rows.end(), [&](auto const& cells) { return cells[0] == entry["label"]; });
        ASSERT_NE(row, rows.end()) << entry;
        EXPECT_EQ(WithoutBlanks((*row)[1]), WithoutBlanks(ValueTextOf(entry)));
        EXPECT_EQ(WithoutBlanks((*row)[2]), WithoutBlanks(entry["source"]));
        EXPECT_EQ(entry["value"].is_null(), entry.contains("code")) << entry;
        ++compared;
      }
    }
    EXPECT_EQ(compared, 19u);
    ASSERT_EQ(document["plugIns"].size(), 1u);
    EXPECT_EQ(document["plugIns"][0]["name"], "Host");
    EXPECT_EQ(document["plugIns"][0]["file"], fZep.Path("lib/libHost.nsp.so"));
    EXPECT_TRUE(document["plugIns"][0]["error"].is_null());
    EXPECT_EQ(document["plugIns"][0]["providers"][0]["namespace"], "root/zep/host");
  }
}

TEST_F(ReportTest, JsonListsEveryInstanceWithItsPath) {
  auto const document = JsonOf(Report(SamplePath(), {"--json"}));
  std::map<std::string, int> counts;
  std::vector<std::string> paths;
  for (auto const& instance : document["instances"]) {
    ++counts[instance["class"]];
    paths.push_back(instance["path"]);
    EXPECT_EQ(instance["path"].get<std::string>().find("root/zep/host:" + instance["class"].get<std::string>() + "."), 0u);
  }
  EXPECT_GT(counts["ZEP_MissingValue"], 3);  // some values are those of this machine
  counts.erase("ZEP_MissingValue");
  EXPECT_EQ(counts, (std::map<std::string, int>{{"QRVSG_ComputerSystem", 1},
                                                {"QRVSG_OperatingSystem", 1},
                                                {"QRVSG_ZEPProduct", 1},
                                                {"CIM_BIOSElement", 1},
                                                {"CIM_Chassis", 1},
                                                {"CIM_Processor", 2},
                                                {"CIM_PhysicalMemory", 8},
                                                {"CIM_MemoryCapacity", 1},
                                                {"CIM_Card", 1},
                                                {"CIM_Slot", 6},
                                                {"ZEP_OnboardDevice", 4},
                                                {"ZEP_IPMIInterface", 1},
                                                {"ZEP_RunningState", 1},
                                                {"CIM_SystemDevice", 3},
                                                {"CIM_SystemBIOS", 1},
                                                {"CIM_ComputerSystemPackage", 2},
                                                {"CIM_RunningOS", 1},
                                                {"CIM_ElementStatisticalData", 1},
                                                {"ZEP_ProcessorChip", 2},
                                                {"ZEP_MemoryModuleSettings", 8},
                                                {"ZEP_FirmwareSettings", 1},
                                                {"ZEP_ChassisState", 1},
                                                {"CIM_Container", 1},
                                                {"CIM_ElementSettingData", 10},
                                                {"CIM_Realizes", 2}}));
  std::sort(paths.begin(), paths.end());
  EXPECT_EQ(std::unique(paths.begin(), paths.end()), paths.end());
}

TEST_F(ReportTest, JsonHasTheReasonForANullProperty) {
  auto const document = JsonOf(Report(RealTablePath("no-serial"), {"--json"}));
  for (auto const& instance : document["instances"]) {
    if (instance["class"] != "QRVSG_ComputerSystem") continue;
    auto const serial = instance["properties"]["SerialNumber"];
    EXPECT_EQ(serial["type"], "string");
    EXPECT_TRUE(serial["value"].is_null());
    EXPECT_EQ(serial["code"], "not-given");
    EXPECT_EQ(serial["reason"], "not given by the firmware");
    EXPECT_EQ(serial["source"], "SMBIOS type 1 (file)");
    EXPECT_EQ(instance["properties"]["Name"]["key"], true);
    return;
  }
  FAIL() << "the document has no computer system";
}

// ---- Sections ----

TEST_F(ReportTest, ASectionHasARowForEachInstance) {
  TRun const run = fZep.Run({{"report", "--sample", "--section", "memory"}});
  EXPECT_EQ(run.fStatus, 0);
  auto const lines = LinesOf(run.fOutput);
  ASSERT_EQ(lines.size(), 13u);
  EXPECT_EQ(lines[3], "SAMPLE Memory modules");
  EXPECT_EQ(lines[4], "Slot          Size    Type  Speed      Maker          Part number  Serial number");
  EXPECT_EQ(lines[5], "CPU 1 DIMM 1  16 GiB  DDR4  2.933 GHz  Example Works  EW16R32-D4   EX4100073");
  EXPECT_EQ(lines[12], "CPU 2 DIMM 4  16 GiB  DDR4  2.933 GHz  Example Works  EW16R32-D4   EX4106912");
}

TEST_F(ReportTest, SeveralSectionsMayBePrinted) {
  TRun const run = fZep.Run({{"report", "--sample", "--section", "plug-ins", "--section", "identity"}});
  EXPECT_THAT(run.fOutput, HasSubstr("\nSAMPLE Identity"));
  EXPECT_THAT(run.fOutput, HasSubstr("\nSAMPLE Plug-in"));
  EXPECT_THAT(run.fOutput, Not(HasSubstr("Details")));
  EXPECT_THAT(run.fOutput, Not(HasSubstr("Memory")));
}

TEST_F(ReportTest, ClassesOfOtherPlugInsAreCounted) {
  fZep.Add("libTest.nsp.so", TEST_PROVIDER);
  TRun const run = Run({"--section", "other"}, {{"ZEP_TEST_PROVIDER", "odd values"}});
  EXPECT_THAT(run.fOutput, HasSubstr("\nOther classes"));
  EXPECT_THAT(run.fOutput, testing::ContainsRegex("\n[A-Za-z_]+ +[0-9]+ +root/test"));
}

TEST_F(ReportTest, ProvidersOfThisMachineAreEmptyForTheSample) {
  fZep.Add("libSensors.nsp.so", TEST_LIB_DIR "/libSensors.nsp.so");
  auto const classesOfSensors = [this](std::vector<std::string> const& arguments) {
    auto const document = JsonOf(fZep.Run({arguments}));
    for (auto const& ns : document["namespaces"])
      if (ns["namespace"] == "root/zep/sensors") return ns["classes"].size();
    return std::size_t(0);
  };
  EXPECT_GT(classesOfSensors({"classes", "--json"}), 0u);
  EXPECT_EQ(classesOfSensors({"classes", "--json", "--sample"}), 0u);
}

// An association has no values of its own that could be those of the sample.
bool IsAssociation(nlohmann::json const& instance) {
  auto const& properties = instance["properties"];
  return std::any_of(properties.begin(), properties.end(), [](auto const& property) { return property["type"] == "reference"; });
}

TEST_F(ReportTest, EveryInstanceIsPrintedOnRequest) {
  TRun const run = fZep.Run({{"report", "--sample", "--full", "--section", "identity"}});
  auto const document = JsonOf(fZep.Run({{"report", "--sample", "--json"}}));
  std::size_t instances = 0;
  for (auto const& instance : document["instances"]) {
    if (instance["class"] == "ZEP_MissingValue" || IsAssociation(instance)) continue;
    bool const isOfSample = run.fOutput.find("\nSAMPLE " + instance["path"].get<std::string>() + "\n") != std::string::npos;
    EXPECT_TRUE(isOfSample || instance["class"] == "QRVSG_OperatingSystem" || instance["class"] == "QRVSG_ZEPProduct" ||
                instance["class"] == "QRVSG_SCSIDevice" || instance["class"] == "ZEP_RunningState")
        << instance["path"];
    instances += isOfSample ? 1 : 0;
  }
  EXPECT_GT(instances, 10u);
  EXPECT_THAT(run.fOutput, Not(HasSubstr("ZEP_MissingValue")));
}

TEST_F(ReportTest, AnUnknownSectionIsWrongUsage) {
  TRun const run = fZep.Run({{"report", "--section", "nothing"}});
  EXPECT_EQ(run.fStatus, 64);
  EXPECT_THAT(run.fErrors, HasSubstr("--section"));
  EXPECT_EQ(fZep.Run({{"report", "--section", "memory", "--json"}}).fStatus, 64);
  EXPECT_EQ(fZep.Run({{"report", "--full", "--json"}}).fStatus, 64);
}

// ---- The sample ----

TEST_F(ReportTest, TheSampleIsLabelledInEveryLineOfTheText) {
  TRun const run = fZep.Run({{"report", "--sample"}});
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fErrors, "");
  auto const lines = LinesOf(run.fOutput);
  ASSERT_GT(lines.size(), 2u);
  EXPECT_EQ(lines[0], "SAMPLE sample-server: Server Q100, type 1234, model AB7, serial number KQ12345");
  EXPECT_THAT(lines[1], StartsWith("SAMPLE operating system of this machine, not of the sample: "));
  for (char const* title : {"SAMPLE Identity", "SAMPLE Details"}) {
    auto const rows = ValueRowsOf(run.fOutput, title);
    EXPECT_FALSE(rows.empty()) << title;
    for (auto const& row : rows)
      EXPECT_TRUE(row[2].find("SAMPLE") == 0 || row[2].find("(not of the sample)") != std::string::npos)
          << row[0] << ": " << row[2];
  }
  EXPECT_EQ(PlugInRowsOf(run.fOutput, "SAMPLE Plug-in").size(), 1u);
}

TEST_F(ReportTest, TheSampleIsLabelledInJson) {
  auto const document = JsonOf(fZep.Run({{"report", "--sample", "--json"}}));
  EXPECT_EQ(document["sample"], true);
  EXPECT_EQ(document["label"], "SAMPLE");
  EXPECT_EQ(document["status"], "complete");
  for (auto const& line : document["head"]) EXPECT_THAT(line.get<std::string>(), StartsWith("SAMPLE "));
  EXPECT_EQ(document["identity"]["hostName"]["value"], "sample-server");
  EXPECT_EQ(document["identity"]["hostName"]["source"], "SAMPLE");
  EXPECT_EQ(document["identity"]["serialNumber"]["source"], "SAMPLE, SMBIOS type 1");
  EXPECT_THAT(document["identity"]["osName"]["source"].get<std::string>(), EndsWith("(not of the sample)"));
  for (auto const& instance : document["instances"])
    for (auto const& [name, property] : instance["properties"].items()) {
      std::string const source = property["source"];
      EXPECT_TRUE(source.find("SAMPLE") == 0 || source.find("(not of the sample)") != std::string::npos ||
                  source == "provider Host")
          << name << ": " << source;
    }
}

TEST_F(ReportTest, TheSampleHidesThisMachinesNameAndTheCallersTable) {
  char name[256] = {};
  ASSERT_EQ(::gethostname(name, sizeof name - 1), 0);
  TCall call;
  call.fArguments = {"report", "--sample", "--json"};
  call.fEnvironment = {{"ZEP_SMBIOS_TABLE", RealTablePath("bare7")}, {"ZEP_HOST_NAME", "db1"}};
  TRun const run = fZep.Run(call);
  EXPECT_THAT(run.fOutput, Not(HasSubstr("\"" + std::string(name) + "\"")));
  EXPECT_THAT(run.fOutput, Not(HasSubstr("db1")));
  EXPECT_EQ(JsonOf(run)["identity"]["productName"]["value"], "Server Q100 -[1234AB7]-");
  EXPECT_TRUE(JsonOf(run)["smbiosTableFile"].is_null());
}

TEST_F(ReportTest, ASampleThatIsNotInstalledIsAnError) {
  fs::remove_all(fZep.Path("share"));
  TRun const run = fZep.Run({{"report", "--sample"}});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: the sample is not installed: " + fZep.Path("share/zepcore/sample/smbios.bin") + " is missing\n");
}

// ---- Plug-ins ----

TEST_F(ReportTest, WithoutPlugInsNothingIsReported) {
  fZep.Remove("libHost.nsp.so");
  TRun const run = Report(RealTablePath("full"));
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(LinesOf(run.fOutput)[0], "Unnamed machine: not identified: no provider plug-in found");
  EXPECT_EQ(LinesOf(run.fOutput)[1], "Operating system: unknown: no provider plug-in found");
  for (char const* title : {"Identity", "Details"})
    for (auto const& row : ValueRowsOf(run.fOutput, title)) {
      EXPECT_EQ(row[1], "unknown: no provider plug-in found");
      EXPECT_EQ(row[2], "none");
    }
  ASSERT_EQ(PlugInRowsOf(run.fOutput).size(), 1u);
  EXPECT_EQ(PlugInRowsOf(run.fOutput)[0][0], "none");
  EXPECT_EQ(WithoutBlanks(PlugInRowsOf(run.fOutput)[0][2]), WithoutBlanks("no file lib*.nsp.so in " + fZep.Path("lib")));

  TRun const json = Report(RealTablePath("full"), {"--json"});
  EXPECT_EQ(json.fStatus, 1);
  auto const document = JsonOf(json);
  EXPECT_EQ(document["status"], "nothing");
  EXPECT_THAT(document["plugIns"], IsEmpty());
  EXPECT_THAT(document["instances"], IsEmpty());
  EXPECT_EQ(document["identity"]["serialNumber"]["code"], "not-described");
}

TEST_F(ReportTest, ABrokenPlugInIsReportedWithTheLinkersReasonAndStopsNoOther) {
  WriteFile(fZep.Path("lib/libBroken.nsp.so"), "this is no library");
  TRun const run = Report(RealTablePath("full"));
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(run.fErrors, "");
  EXPECT_EQ(LinesOf(run.fOutput)[0], "db1: Server Q100, type 1234, model AB7, serial number KQ12345");
  auto const rows = PlugInRowsOf(run.fOutput);
  ASSERT_EQ(rows.size(), 2u);
  EXPECT_EQ(rows[0][0], "Broken");
  EXPECT_THAT(rows[0][1], testing::MatchesRegex("[0-9]+\\.[0-9] ms"));
  EXPECT_EQ(WithoutBlanks(rows[0][2]),
            WithoutBlanks("failed: " + fZep.Path("bin/../lib/libBroken.nsp.so") + ": file too short (open, libBroken.nsp.so)"));
  EXPECT_EQ(rows[1][0], "Host");
  EXPECT_EQ(rows[1][2], "filled root/zep/host");

  auto const plugIn = JsonOf(Report(RealTablePath("full"), {"--json"}))["plugIns"][0];
  EXPECT_EQ(plugIn["error"], fZep.Path("bin/../lib/libBroken.nsp.so") + ": file too short");
  EXPECT_EQ(plugIn["file"], fZep.Path("lib/libBroken.nsp.so"));
  EXPECT_THAT(plugIn["providers"], IsEmpty());
}

TEST_F(ReportTest, ABrokenPlugInAloneReportsNothing) {
  fZep.Remove("libHost.nsp.so");
  WriteFile(fZep.Path("lib/libBroken.nsp.so"), "this is no library");
  TRun const run = Report(RealTablePath("full"));
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(LinesOf(run.fOutput)[0], "Unnamed machine: not identified: no provider plug-in could be used");
}

TEST_F(ReportTest, AProviderThatFailsIsReportedAndStopsNoOther) {
  struct TRow {
    char const *fBehaviour, *fResult;
  } const rows[] = {
      {"throws", "provider Test failed: kZEPStatusAccessDenied"},
      {"throws-a-number", "provider Test failed: it threw an object that is not a std::exception"},
      {"no-namespace", "provider Test failed: it has no namespace"},
      {"fails-at-once", "provider Test failed: it threw an object that is not a std::exception"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fBehaviour);
    TRun const run = RunWithTestProvider(row.fBehaviour);
    EXPECT_EQ(run.fStatus, 2);
    EXPECT_EQ(LinesOf(run.fOutput)[0], "db1: Server Q100, type 1234, model AB7, serial number KQ12345");
    auto const plugIns = PlugInRowsOf(run.fOutput);
    ASSERT_EQ(plugIns.size(), 2u);
    EXPECT_EQ(plugIns[1][0], "Test");
    EXPECT_EQ(WithoutBlanks(plugIns[1][2]), WithoutBlanks(std::string(row.fResult) + " (fill, libTest.nsp.so)"));
    auto const provider = JsonOf(RunWithTestProvider(row.fBehaviour, {"--json"}))["plugIns"][1]["providers"][0];
    EXPECT_EQ("provider Test failed: " + provider["error"].get<std::string>(), row.fResult);
    EXPECT_TRUE(provider["namespace"].is_null());
  }
  EXPECT_EQ(JsonOf(RunWithTestProvider("fails-at-once", {"--json", "--in-process"}))["plugIns"][1]["providers"][0]["error"],
            "kZEPStatusFail");
}

TEST_F(ReportTest, TheReasonOfAFailureIsReported) {
  TRun const run = RunWithTestProvider("is-refused", {"--json"});
  EXPECT_EQ(run.fStatus, 2);
  std::string const error = JsonOf(run)["plugIns"][1]["providers"][0]["error"];
  EXPECT_EQ(error,
            "kZEPStatusTypeMismatch (X_Refused.Kind refused: kZEPStatusTypeMismatch: the value is a string instead of a uint16)");
  EXPECT_EQ(WithoutBlanks(PlugInRowsOf(RunWithTestProvider("is-refused").fOutput)[1][2]),
            WithoutBlanks(
                "provider Test failed: " + error +
                " (fill, libTest.nsp.so); last log line: [Error] X_Refused.Kind refused: kZEPStatusTypeMismatch: the value is a "
                "string instead of a uint16"));
}

TEST_F(ReportTest, ANamespaceThatFailsLaterIsReportedWhereItFails) {
  fZep.Remove("libHost.nsp.so");
  TRun const run = RunWithTestProvider("fails-later", {"--in-process"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(ValueIn(run.fOutput, "Serial number"), "unknown: provider Test failed: kZEPStatusFail");

  auto const document = JsonOf(RunWithTestProvider("fails-later", {"--json", "--in-process"}));
  EXPECT_THAT(document["instances"], IsEmpty());
  EXPECT_EQ(document["instanceFailures"][0]["provider"], "Test");
  EXPECT_EQ(document["instanceFailures"][0]["error"], "it threw an object that is not a std::exception");
}

TEST_F(ReportTest, ANamespaceWhoseClassesCannotBeReadIsReported) {
  fZep.Remove("libHost.nsp.so");
  TRun const run = RunWithTestProvider("fails-later", {"--json"});
  EXPECT_EQ(run.fStatus, 1);
  auto const provider = JsonOf(run)["plugIns"][0]["providers"][0];
  EXPECT_EQ(provider["error"], "it threw an object that is not a std::exception");
  EXPECT_EQ(provider["stage"], "fill");
}

TEST_F(ReportTest, APlugInThatRegistersNothingIsReported) {
  TRun const run = RunWithTestProvider("is-silent");
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(PlugInRowsOf(run.fOutput)[1][2], "loaded, but registered no provider of its own");
}

TEST_F(ReportTest, TwoPlugInsThatRegisterOneNameAreBothNamed) {
  TRun const run = RunWithTestProvider("calls-itself-host");
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(PlugInRowsOf(run.fOutput)[0][2], "filled root/zep/host");
  EXPECT_EQ(WithoutBlanks(PlugInRowsOf(run.fOutput)[1][2]),
            WithoutBlanks("provider Host failed: the name Host is already registered by libHost.nsp.so (registration, "
                          "libTest.nsp.so)"));
}

TEST_F(ReportTest, OutputOfPlugInsStaysOutOfTheDocument) {
  TRun const run = RunWithTestProvider("prints", {"--json"});
  EXPECT_EQ(JsonOf(run)["plugIns"].size(), 2u);
  EXPECT_THAT(run.fOutput, StartsWith("{"));
  EXPECT_EQ(run.fErrors, "zep: plug-in Test printed: noise while loading\nzep: plug-in Test printed: noise while filling\n");
  EXPECT_EQ(JsonOf(run)["plugIns"][1]["words"], "noise while loading\nnoise while filling\n");
  TRun const inProcess = RunWithTestProvider("prints", {"--json", "--in-process"});
  EXPECT_THAT(inProcess.fOutput, StartsWith("{"));
  EXPECT_THAT(inProcess.fErrors, AllOf(HasSubstr("noise while loading"), HasSubstr("noise while filling")));
}

TEST_F(ReportTest, TheFirstProviderThatKnowsAValueGivesIt) {
  EXPECT_EQ(ValueIn(RunWithTestProvider("one-system").fOutput, "Host name"), "db1");
  fZep.Remove("libHost.nsp.so");
  TRun const run = RunWithTestProvider("one-system");
  EXPECT_EQ(run.fStatus, 2);
  EXPECT_EQ(LinesOf(run.fOutput)[0], "one: 1234AB7, type 1234, model AB7, serial number KQ12345");
  EXPECT_EQ(ValueRowsOf(run.fOutput, "Identity")[0][2], "provider Test");
  EXPECT_EQ(ValueIn(run.fOutput, "OS"), "unknown: no provider describes it");
}

TEST_F(ReportTest, TwoSystemsAreNotOneIdentity) {
  fZep.Remove("libHost.nsp.so");
  TRun const run = RunWithTestProvider("two-systems");
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(ValueIn(run.fOutput, "Serial number"), "unknown: the provider describes 2 instances");
}

// ---- Foreign bytes ----

TEST_F(ReportTest, FirmwareTextCannotControlTheTerminal) {
  std::string const table = fZep.Table(SystemInformation("\x1b]0;owned\x07\x1b[2J\xff Q \xc3\xa9 \xe2\x80\xae -[1234AB7]-",
                                                         "\x9b"
                                                         "31m\n\t") +
                                       EndOfTable());
  TRun const text = Report(table);
  for (unsigned char c : text.fOutput) EXPECT_TRUE(c == '\n' || (c >= 0x20 && c != 0x7f)) << static_cast<int>(c);
  EXPECT_THAT(LinesOf(text.fOutput)[0],
              StartsWith("db1: \\x1b]0;owned\\x07\\x1b[2J\\xff Q \xc3\xa9 \\u202e, type 1234, model AB7"));

  TRun const json = Report(table, {"--json"});
  EXPECT_EQ(JsonOf(json)["identity"]["productName"]["value"],
            "\x1b]0;owned\x07\x1b[2J\xef\xbf\xbd Q \xc3\xa9 \xe2\x80\xae -[1234AB7]-");
  EXPECT_THAT(json.fOutput, Not(HasSubstr("\x1b")));
}

TEST_F(ReportTest, OddValuesOfAProviderMakeOneValidDocument) {
  auto const document = JsonOf(RunWithTestProvider("odd", {"--json"}));
  for (auto const& instance : document["instances"]) {
    if (instance["class"] != "X_Odd") continue;
    auto const& properties = instance["properties"];
    EXPECT_EQ(properties["Text"]["value"], "\x1b]0;title\x07 \xe2\x80\xae reversed");
    EXPECT_EQ(properties["Bytes"]["value"], "\xef\xbf\xbd\xef\xbf\xbd not UTF-8");
    EXPECT_EQ(properties["Flag"]["value"], true);
    EXPECT_EQ(properties["Large"]["value"], "18446744073709551615");
    EXPECT_EQ(properties["Small"]["value"], "-9223372036854775808");
    EXPECT_EQ(properties["Half"]["value"], 0.5);
    EXPECT_EQ(properties["Infinite"]["value"], "inf");
    EXPECT_EQ(properties["List"]["type"], "string[]");
    EXPECT_EQ(properties["List"]["value"], nlohmann::json({"a", "b, c"}));
    EXPECT_EQ(properties["Numbers"]["value"], nlohmann::json({1, 255}));
    EXPECT_TRUE(properties["Nothing"]["value"].is_null());
    EXPECT_EQ(properties["Nothing"]["reason"], "the provider gives no value");
    EXPECT_EQ(properties["Nothing"]["source"], "provider Test");
    return;
  }
  FAIL() << "the document has no odd instance";
}

TEST_F(ReportTest, TablesFitIntoEightyColumns) {
  WriteFile(fZep.Path("lib/libBroken.nsp.so"), "this is no library");
  for (TRun const& run : {Report(fZep.Table(SystemInformation(std::string(300, 'x'), std::string(200, 'y')) + EndOfTable())),
                          fZep.Run({{"report", "--sample"}}), Run({}, {})}) {
    auto const lines = LinesOf(run.fOutput);
    bool isTable = false;  // the head lines precede the first empty line
    for (std::string const& line : lines) {
      isTable = isTable || line.empty();
      if (!isTable) continue;
      EXPECT_LE(line.size(), 80u) << line;
    }
  }
}

// ---- Where the output goes ----

TEST_F(ReportTest, AClosedPipeEndsZepSilently) {
  int ends[2];
  ASSERT_EQ(::pipe(ends), 0);
  ::close(ends[0]);
  TCall call;
  call.fArguments = {"report", "--sample"};
  call.fOutputDescriptor = ends[1];
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 128 + SIGPIPE);
  EXPECT_EQ(run.fErrors, "");

  call.fIgnoresBrokenPipes = true;
  TRun const ignoring = fZep.Run(call);
  EXPECT_EQ(ignoring.fStatus, 1);
  EXPECT_EQ(ignoring.fErrors, "zep: standard output cannot be written: Broken pipe\n");
  ::close(ends[1]);
}

TEST_F(ReportTest, AFullDiskIsAnError) {
  if (!fs::exists("/dev/full")) GTEST_SKIP() << "/dev/full is missing";
  TCall call;
  call.fArguments = {"report", "--json", "--sample"};
  call.fOutputFile = "/dev/full";
  TRun const run = fZep.Run(call);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: standard output cannot be written: No space left on device\n");
}

// ---- Arguments ----

TEST_F(ReportTest, WrongUsageIsReportedOnStandardError) {
  std::vector<std::string> const calls[] = {{},
                                            {"nonsense"},
                                            {"report", "--nonsense"},
                                            {"report", "extra"},
                                            {"--nonsense"},
                                            {"report", "show"},
                                            {"report", "--json=perhaps"},
                                            {"show"},
                                            {"show", "a", "b"}};
  for (auto const& arguments : calls) {
    SCOPED_TRACE(testing::PrintToString(arguments));
    TCall call;
    call.fArguments = arguments;
    TRun const run = fZep.Run(call);
    EXPECT_EQ(run.fStatus, 64);
    EXPECT_EQ(run.fOutput, "");
    EXPECT_NE(run.fErrors, "");
  }
}

TEST_F(ReportTest, HelpAndVersionArePrinted) {
  TRun const version = fZep.Run({{"--version"}});
  EXPECT_EQ(version.fStatus, 0);
  EXPECT_EQ(version.fOutput, "zep " TEST_VERSION " (build " TEST_BUILD_ID ")\n");
  struct TRow {
    std::vector<std::string> fArguments;
    std::vector<char const*> fWords;
  } const rows[] = {
      {{"--help"}, {"report", "show", "--version"}},
      {{"-h"}, {"report", "show"}},
      {{"report", "--help"}, {"--json", "--sample", "Exit status"}},
      {{"show", "--help"}, {"path", "--json", "--sample", "Exit status"}},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(testing::PrintToString(row.fArguments));
    TCall call;
    call.fArguments = row.fArguments;
    TRun const run = fZep.Run(call);
    EXPECT_EQ(run.fStatus, 0);
    EXPECT_EQ(run.fErrors, "");
    for (char const* word : row.fWords) EXPECT_THAT(run.fOutput, HasSubstr(word));
  }
}

}  // namespace
}  // namespace NQRVZEP20::zep
