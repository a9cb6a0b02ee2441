// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "tests/LogOf.h"
#include "tests/SmbiosTables.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>

namespace NQRVZEP20 {
namespace {

using testing::Contains;
using testing::ElementsAre;

// The tables of a machine, read through the platform library of the build.
class TOSSpecificMachineTest : public testing::Test {
protected:
  void UseTable(std::string const& table) {
    WriteFile(fDir.Path("table"), table);
    ::setenv("ZEP_SMBIOS_TABLE", fDir.Path("table").c_str(), 1);
  }
  void UseNoTable() { ::setenv("ZEP_SMBIOS_TABLE", fDir.Path("absent").c_str(), 1); }

  TTempDir fDir;
  TEnvironmentGuard const fVariable{"ZEP_SMBIOS_TABLE", nullptr};  // puts it back
};

struct TIdentityRow {
  char const* fTable;
  char const* fType;
  char const* fName;
  char const* fModel;
  char const* fSerialNumber;
  char const* fBiosId;
};

void ExpectIdentity(TIdentityRow const& row) {
  EXPECT_EQ(TOSSpecific::GetMachineType(), row.fType);
  EXPECT_EQ(TOSSpecific::GetMachineTypeFromID(), row.fType);
  EXPECT_EQ(TOSSpecific::GetMachineInfo("type"), row.fType);
  EXPECT_EQ(TOSSpecific::GetMachineName(), row.fName);
  EXPECT_EQ(TOSSpecific::GetMachineInfo("name"), row.fName);
  EXPECT_EQ(TOSSpecific::GetOperatingSystemName(), row.fName) << "the machine's name, not the operating system's";
  EXPECT_EQ(TOSSpecific::GetMachineModel(), row.fModel);
  EXPECT_EQ(TOSSpecific::GetMachineInfo("model"), row.fModel);
  EXPECT_EQ(TOSSpecific::GetMachineSN(), row.fSerialNumber);
  EXPECT_EQ(TOSSpecific::GetMachineInfo("SN"), row.fSerialNumber);
  EXPECT_EQ(TOSSpecific::GetBiosID(), row.fBiosId);
}

TEST_F(TOSSpecificMachineTest, ReadsRealTables) {
  TIdentityRow const rows[] = {
      {"full", "1234", "Server Q100 ", "AB7", "KQ12345", "AB"},    {"bare7", "1234", "Unknown", "Unknown", "KQ12345", "AB"},
      {"eight", "0000", "Unknown", "Unknown", "KQ12345", "7"},  // the BIOS version has one character
      {"no-serial", "5678", "Server", "XY1", "Unknown", "AB"},     {"two-dashes", "erve", "Rack", "r Q", "KQ 99", "AB"},
      {"qemu-own", "0000", "Unknown", "Unknown", "Unknown", "AB"}, {"entry64", "1234", "Server Q100 ", "AB7", "KQ12345", "AB"},
  };
  for (TIdentityRow const& row : rows) {
    SCOPED_TRACE(row.fTable);
    UseTable(RealTable(row.fTable));
    ExpectIdentity(row);
  }
}

TEST_F(TOSSpecificMachineTest, ReadsTheSampleThatTheFrontEndBringsAlong) {
  UseTable(ReadFile(SamplePath()));
  ExpectIdentity({"sample", "1234", "Server Q100 ", "AB7", "KQ12345", "QA"});
}

TEST_F(TOSSpecificMachineTest, WithoutATableEveryOperationGivesItsDefault) {
  UseNoTable();
  ExpectIdentity({"none", "0000", "Unknown", "Unknown", "Unknown", "00"});
}

TEST_F(TOSSpecificMachineTest, HostileTablesGiveTheDefaults) {
  std::string const full = RealTable("full");
  TIdentityRow const defaults = {"", "0000", "Unknown", "Unknown", "Unknown", "00"};
  std::pair<char const*, std::string> const tables[] = {
      {"an empty file", ""},
      {"one byte", "x"},
      {"noise", std::string(65536, '\xA5')},
      {"zeros", std::string(65536, '\0')},
      {"no type 0 or 1", Structure(3, "") + EndOfTable()},
      {"types 0 and 1 after the end", EndOfTable() + full},
      {"types 0 and 1 without fields", Structure(0, "") + Structure(1, "") + EndOfTable()},
      {"string numbers 0", Structure(0, "\0\0"s, {"AB"}) + Structure(1, "\0\0\0\0"s, {"1234AB7"})},
      {"string numbers past the set", Structure(0, "\0\2"s, {"AB"}) + Structure(1, "\0\2\0\3"s, {"1234AB7"})},
      {"string numbers 255", Structure(0, "\0\xFF"s, {"AB"}) + Structure(1, "\0\xFF\0\xFF"s, {"1234AB7"})},
      {"fields in the string set", Structure(0, "", {"\1\1", "AB"}) + Structure(1, "", {"\1\1\1\1", "1234AB7"})},
      {"cut inside type 0", full.substr(0, 30)},
  };
  for (auto const& [what, table] : tables) {
    SCOPED_TRACE(what);
    UseTable(table);
    ExpectIdentity(defaults);
  }
}

TEST_F(TOSSpecificMachineTest, NoTruncationOfARealTableThrows) {
  std::string const full = RealTable("full");
  for (std::size_t size = 0; size < full.size(); size += 7) {
    SCOPED_TRACE(size);
    UseTable(full.substr(0, size));
    std::string const type = TOSSpecific::GetMachineTypeFromID();
    EXPECT_TRUE(type == "0000" || type == "1234") << type;
    std::string const id = TOSSpecific::GetBiosID();
    EXPECT_TRUE(id == "00" || id == "AB") << id;
  }
}

TEST_F(TOSSpecificMachineTest, KeysAreComparedCaseSensitively) {
  UseTable(RealTable("full"));
  for (char const* key : {"Type", "TYPE", "sn", "Name", "Model", "", " type", "type "})
    EXPECT_EQ(TOSSpecific::GetMachineInfo(key), "error param of GetMachineInfo") << key;
  UseNoTable();
  EXPECT_EQ(TOSSpecific::GetMachineInfo("Type"), "error param of GetMachineInfo") << "also when nothing can be read";
}

TEST_F(TOSSpecificMachineTest, AStructureOfMoreThan1024BytesIsReadUpToThere) {
  std::string const fields = "\0\2\0\3"s;
  std::size_t const room = 1024 - 4 - fields.size();
  // The zero of the product name is the third-last or the second-last byte of the buffer.
  for (std::size_t spare : {2, 1}) {
    SCOPED_TRACE(spare);
    std::string const product = "1234AB7";
    UseTable(Structure(1, fields, {std::string(room - product.size() - spare - 2, 'x'), product, "KQ12345"}));
    EXPECT_EQ(TOSSpecific::GetMachineType(), "1234");
    EXPECT_EQ(TOSSpecific::GetMachineSN(), "Unknown") << "the string is after the end of the buffer";
  }
}

TEST_F(TOSSpecificMachineTest, TheBiosVersionMustEndWithinTheFirst100BytesOfItsStrings) {
  for (auto const& [vendorLength, biosID] :
       {std::pair(95, "QD"), std::pair(96, "QD"), std::pair(97, "00"), std::pair(200, "00")}) {
    SCOPED_TRACE(vendorLength);
    UseTable(Structure(0, "\1\2"s, {std::string(static_cast<std::size_t>(vendorLength), 'v'), "QD"}));
    EXPECT_EQ(TOSSpecific::GetBiosID(), biosID);
  }
  UseTable(Structure(0, "\2\1"s, {std::string(99, 'v')}));
  EXPECT_EQ(TOSSpecific::GetBiosID(), "vv");
  UseTable(Structure(0, "\2\1"s, {std::string(100, 'v')}));
  EXPECT_EQ(TOSSpecific::GetBiosID(), "00");
}

TEST_F(TOSSpecificMachineTest, TheBiosIDIsTheFirstTwoCharactersOrNone) {
  struct TRow {
    char const* fVersion;
    char const* fBiosId;
  };
  TRow const rows[] = {
      {"-[ABE123CUS-1.10]-", "AB"},
      {"ab12", "ab"},
      {"-[12-3]-", "12"},
      {"XY", "XY"},
      {"-[X-1.10]-", "X"},  // all there is
      {"X", "X"},
      {"-1.10", "00"},
      {"[]", "00"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fVersion);
    UseTable(BiosInformation(row.fVersion));
    EXPECT_EQ(TOSSpecific::GetBiosID(), row.fBiosId);
  }
}

TEST_F(TOSSpecificMachineTest, TheMachineTypeIsThatOfTheBiosBuildWhereTheTableKnowsIt) {
  struct TRow {
    char const* fVersion;
    char const* fType;
  };
  TRow const rows[] = {
      {"-[QSE118B-1.30]-", "5678"}, {"-[118BQS-1.30]-", "5678"}, {"-[QXQS-1.30]-", "5678"},
      {"-[ABE118B-1.30]-", "1234"}, {"-[ABE-QS]-", "1234"},  // only the part before the hyphen counts
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fVersion);
    UseTable(BiosInformation(row.fVersion) + SystemInformation("Server Q100 -[1234AB7]-", "KQ12345"));
    EXPECT_EQ(TOSSpecific::GetMachineTypeFromID(), row.fType);
    EXPECT_EQ(TOSSpecific::GetMachineType(), "1234");
  }
}

// ---- The log entries, all at debug severity and in this order ----

TEST_F(TOSSpecificMachineTest, GetMachineTypeLogsItsResult) {
  UseTable(RealTable("full"));
  EXPECT_THAT(LogOf([] { TOSSpecific::GetMachineType(); }),
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] Machine type detected: 1234",
                          "[Debug] getMachineType() completed."));
}

TEST_F(TOSSpecificMachineTest, GetMachineInfoLogsEachField) {
  std::vector<std::string> const expected = {
      "[Debug] getMachineInfo() entered.",
      "[Debug] GetMachineInfo productDesc",
      "[Debug] Server Q100 -[1234AB7]-",
      "[Debug] GetMachineInfo machineName",
      "[Debug] Server Q100 ",
      "[Debug] GetMachineInfo machineType",
      "[Debug] 1234",
      "[Debug] GetMachineInfo machineModel",
      "[Debug] AB7",
      "[Debug] Machine type detected: 1234",
      "[Debug] getMachineType() completed.",
  };
  UseTable(RealTable("full"));
  for (char const* key : {"type", "name", "model", "SN", "Type"})
    EXPECT_EQ(LogOf([&] { TOSSpecific::GetMachineInfo(key); }), expected) << key;
  EXPECT_EQ(LogOf([] { TOSSpecific::GetMachineSN(); }), expected);
  EXPECT_EQ(LogOf([] { TOSSpecific::GetMachineModel(); }), expected);
  EXPECT_EQ(LogOf([] { TOSSpecific::GetMachineName(); }), expected);
  EXPECT_EQ(LogOf([] { TOSSpecific::GetOperatingSystemName(); }), expected);
}

TEST_F(TOSSpecificMachineTest, GetMachineInfoLogsTheDefaultsOfAnUnknownProduct) {
  UseTable(Structure(1, "\0\7\0\1"s, {"KQ12345"}));
  EXPECT_THAT(LogOf([] { EXPECT_EQ(TOSSpecific::GetMachineInfo("SN"), "KQ12345"); }),
              ElementsAre("[Debug] getMachineInfo() entered.", "[Debug] GetMachineInfo productDesc", "[Debug] ",
                          "[Debug] GetMachineInfo machineName", "[Debug] Unknown", "[Debug] GetMachineInfo machineType",
                          "[Debug] 0000", "[Debug] GetMachineInfo machineModel", "[Debug] Unknown",
                          "[Debug] Machine type detected: 0000", "[Debug] getMachineType() completed."));
}

TEST_F(TOSSpecificMachineTest, ATableWithoutType1IsLogged) {
  UseTable(EndOfTable());
  EXPECT_THAT(LogOf([] { TOSSpecific::GetMachineType(); }),
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] Unable to read DMI structure type 1 from SMBIOS"));
  EXPECT_THAT(LogOf([] { TOSSpecific::GetMachineInfo("SN"); }),
              ElementsAre("[Debug] getMachineInfo() entered.", "[Debug] Unable to read DMI structure type 1 from SMBIOS"));
}

TEST_F(TOSSpecificMachineTest, TablesThatCannotBeOpenedAreLoggedWithTheStatus) {
  UseNoTable();
  EXPECT_THAT(LogOf([] { TOSSpecific::GetMachineType(); }),
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] getMachineType: Unable to open SMBIOS lib error = 26"));
  EXPECT_THAT(LogOf([] { TOSSpecific::GetMachineInfo("SN"); }),
              ElementsAre("[Debug] getMachineInfo() entered.", "[Debug] getMachineType: Unable to open SMBIOS lib error = 26"));
  EXPECT_THAT(LogOf([] { TOSSpecific::GetBiosID(); }), ElementsAre("[Debug] GetBiosID: Unable to open SMBIOS lib error = 26"));
  EXPECT_THAT(LogOf([] { TOSSpecific::GetMachineTypeFromID(); }),
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] getMachineType: Unable to open SMBIOS lib error = 26",
                          "[Debug] getBIOSstructure: Unable to open SMBIOS lib error = 26",
                          "[Debug] Failed in getting machineType from Bios ID.\nGet machineType from GetMachineType().\n"
                          "machineType=0000"));
}

TEST_F(TOSSpecificMachineTest, GetBiosIDLogsTheIdentifier) {
  UseTable(RealTable("full"));
  EXPECT_THAT(LogOf([] { TOSSpecific::GetBiosID(); }),
              ElementsAre("[Debug] TOSSpecific::GetBiosID - Retrieving first SMBIOS structure",
                          "[Debug] TOSSpecific::GetBiosID - biosID = AB"));
}

TEST_F(TOSSpecificMachineTest, GetBiosIDWithoutType0Stops) {
  UseTable(SystemInformation("1234AB7", "KQ12345"));
  EXPECT_THAT(LogOf([] { EXPECT_EQ(TOSSpecific::GetBiosID(), "00"); }),
              ElementsAre("[Debug] TOSSpecific::GetBiosID - Retrieving first SMBIOS structure",
                          "[Debug] TOSSpecific::GetBiosID - read all smbios structures available for type 0"));
}

TEST_F(TOSSpecificMachineTest, GetMachineTypeFromIDLogsTheRowThatMatches) {
  UseTable(BiosInformation("-[QSE118B-1.30]-") + SystemInformation("1234AB7", "KQ12345"));
  EXPECT_THAT(LogOf([] { TOSSpecific::GetMachineTypeFromID(); }),
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] Machine type detected: 1234",
                          "[Debug] getMachineType() completed.",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - Retrieving first SMBIOS structure",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - buildNumber is qse118b",
                          "[Debug] Get machineType from Bios ID().\nmachineType=5678\tBios ID =QSE118B"));
}

TEST_F(TOSSpecificMachineTest, GetMachineTypeFromIDLogsThatNoRowMatches) {
  UseTable(RealTable("full"));
  EXPECT_THAT(LogOf([] { TOSSpecific::GetMachineTypeFromID(); }),
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] Machine type detected: 1234",
                          "[Debug] getMachineType() completed.",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - Retrieving first SMBIOS structure",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - buildNumber is abe123cus",
                          "[Debug] Failed in getting machineType from Bios ID.\nGet machineType from GetMachineType().\n"
                          "machineType=1234"));
}

TEST_F(TOSSpecificMachineTest, GetMachineTypeFromIDWithoutType0FallsBack) {
  UseTable(SystemInformation("1234AB7", "KQ12345"));
  EXPECT_THAT(LogOf([] { EXPECT_EQ(TOSSpecific::GetMachineTypeFromID(), "1234"); }),
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] Machine type detected: 1234",
                          "[Debug] getMachineType() completed.",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - Retrieving first SMBIOS structure",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - read all smbios structures available for type 0",
                          "[Debug] Failed in getting machineType from Bios ID.\nGet machineType from GetMachineType().\n"
                          "machineType=1234"));
}

// ---- getBIDString ----

// The result and the output area, which was filled with '#'.
std::string BIDString(std::string set, int length, int number) {
  char output[16];
  std::memset(output, '#', sizeof output);
  int const result = TOSSpecific::getBIDString(set.data(), output, length, number);
  return std::to_string(result) + " " + std::string(output, sizeof output);
}

TEST(GetBIDStringTest, CopiesTheStringOfThatNumber) {
  std::string const nothing(16, '#');
  struct TRow {
    char const* fWhat;
    std::string fSet;
    int fLength, fNumber;
    std::string fResult;
  };
  std::string const two = "one\0three\0\0"s;  // and the zero that closes the set
  TRow const rows[] = {
      {"number 1, without its zero", two, 11, 1, "1 one" + std::string(13, '#')},
      {"a later number, with its zero", two, 11, 2, "1 three\0"s + std::string(10, '#')},
      {"number 3 of two", two, 11, 3, "0 " + nothing},
      {"number 3 of two, without the closing zero", two, 10, 3, "0 " + nothing},
      {"number 3 of two, zeros after them", two + std::string(80, '\0'), 91, 3, "0 " + nothing},
      {"number 4 of two, zeros after them", two + std::string(80, '\0'), 91, 4, "0 " + nothing},
      {"number 0", two, 11, 0, "0 " + nothing},
      {"a negative number", two, 11, -1, "0 " + nothing},
      {"length 0", two, 0, 1, "0 " + nothing},
      {"a negative length", two, -5, 1, "0 " + nothing},
      {"a length that cuts the string", two, 9, 2, "0 " + nothing},
      {"a length that ends with the string's zero", two, 10, 2, "1 three\0"s + std::string(10, '#')},
      {"a length that cuts the first string", two, 3, 1, "0 " + nothing},
      {"a length that just holds the first string", two, 4, 1, "1 one" + std::string(13, '#')},
      {"an empty set", "\0\0"s, 2, 1, "0 " + nothing},
      {"an empty string between others", "a\0\0b\0\0"s, 6, 2, "1 \0"s + std::string(15, '#')},
      {"a string after an empty one", "a\0\0b\0\0"s, 6, 3, "1 b\0"s + std::string(14, '#')},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    EXPECT_EQ(BIDString(row.fSet, row.fLength, row.fNumber), row.fResult);
  }
}

TEST(GetBIDStringTest, ReadsNothingAfterTheLength) {
  for (std::string const& set : {"one\0three\0"s, "one"s, "\0\0\0"s, "x\0"s})
    for (int number = -1; number < 5; ++number) {
      std::unique_ptr<char[]> const exact(new char[set.size()]);
      std::memcpy(exact.get(), set.data(), set.size());
      char output[16] = {};
      int const found = TOSSpecific::getBIDString(exact.get(), output, static_cast<int>(set.size()), number);
      EXPECT_EQ(found == 1, std::strlen(output) > 0) << number;
    }
}

// ---- Other libraries of the name libsmbios.so, through a program that the loader's search path leads to them ----

struct TProbeRun {
  std::string fResult;
  std::vector<std::string> fLog, fCalls;
};

class SmbiosStandInTest : public testing::Test {
protected:
  // Runs the operation in a process whose loader searches `libraryDir` first and then `coreDir`.
  TProbeRun Run(std::string const& operation, std::string const& environment = "",
                std::string const& libraryDir = ZEP_STANDIN_DIR "/whole", std::string const& coreDir = BuildPath("lib")) {
    std::string const record = fDir.Path("record");
    WriteFile(record, "");
    std::istringstream output(OutputOfCommand("LD_LIBRARY_PATH=" + libraryDir + ":" + coreDir + " STANDIN_RECORD=" + record +
                                              " " + environment + " " ZEP_IDENTITY_PROBE " " + operation));
    TProbeRun run;
    std::getline(output, run.fResult, '\x1E');
    for (std::string entry; std::getline(output, entry, '\x1E');) run.fLog.push_back(entry);
    std::istringstream calls(ReadFile(record));
    for (std::string call; std::getline(calls, call);) run.fCalls.push_back(call);
    return run;
  }

  std::string StructureFile(std::string const& structure) {
    WriteFile(fDir.Path("structure"), structure);
    return "STANDIN_STRUCTURE=" + fDir.Path("structure") + " ";
  }

  TTempDir fDir;
};

std::string const kLoaded = "smBiosLoad(null)";
std::string const kGotType1 = "smBiosGetFirst(its handle, 1, cleared buffer, 1024)";
std::string const kGotType0 = "smBiosGetFirst(its handle, 0, cleared buffer, 4096)";
std::string const kClosed = "smBiosClose(its handle)";

TEST_F(SmbiosStandInTest, TheLoadersSearchPathIsUsedFirst) {
  TProbeRun const run = Run("SN", StructureFile(SystemInformation("Server Q100 -[1234AB7]-", "KQ12345")));
  EXPECT_EQ(run.fResult, "KQ12345");
  EXPECT_THAT(run.fCalls, ElementsAre(kLoaded, kGotType1, kClosed));
}

TEST_F(SmbiosStandInTest, GetBiosIDReadsType0AndCloses) {
  TProbeRun const run = Run("GetBiosID", StructureFile(BiosInformation("-[ABE123CUS-1.10]-")));
  EXPECT_EQ(run.fResult, "AB");
  EXPECT_THAT(run.fCalls, ElementsAre(kLoaded, kGotType0, kClosed));
}

TEST_F(SmbiosStandInTest, GetMachineTypeFromIDReadsType1ThenType0) {
  TProbeRun const run = Run("GetMachineTypeFromID", StructureFile(BiosInformation("-[QSE118B-1.10]-")));
  EXPECT_EQ(run.fResult, "5678");
  EXPECT_THAT(run.fCalls, ElementsAre(kLoaded, kGotType1, kClosed, kLoaded, kGotType0, kClosed));
}

TEST_F(SmbiosStandInTest, AFailedLoadIsLoggedAndNothingElseIsCalled) {
  for (int status : {3, 27, -1}) {
    SCOPED_TRACE(status);
    std::string const failing = "STANDIN_LOAD_STATUS=" + std::to_string(status);
    std::string const number = std::to_string(status);
    TProbeRun const type = Run("GetMachineType", failing);
    EXPECT_EQ(type.fResult, "0000");
    EXPECT_THAT(type.fLog, ElementsAre("[Debug] getMachineType() entered.",
                                       "[Debug] getMachineType: Unable to open SMBIOS lib error = " + number));
    EXPECT_THAT(type.fCalls, ElementsAre(kLoaded));

    TProbeRun const bios = Run("GetBiosID", failing);
    EXPECT_EQ(bios.fResult, "00");
    EXPECT_THAT(bios.fLog, ElementsAre("[Debug] GetBiosID: Unable to open SMBIOS lib error = " + number));
    EXPECT_THAT(bios.fCalls, ElementsAre(kLoaded));
  }
}

TEST_F(SmbiosStandInTest, ANullHandleIsNotUsed) {
  TProbeRun const type = Run("GetMachineType", "STANDIN_NO_HANDLE=1");
  EXPECT_EQ(type.fResult, "0000");
  EXPECT_THAT(type.fLog, ElementsAre("[Debug] getMachineType() entered.",
                                     "[Debug] Unable to read machine type from SMBIOS. Invalid Handle was encountered."));
  EXPECT_THAT(type.fCalls, ElementsAre(kLoaded));

  TProbeRun const bios = Run("GetBiosID", "STANDIN_NO_HANDLE=1");
  EXPECT_EQ(bios.fResult, "00");
  EXPECT_THAT(bios.fLog, ElementsAre("[Debug] TOSSpecific::GetBiosID - Retrieving first SMBIOS structure",
                                     "[Debug] TOSSpecific::GetBiosID - smbios read operation failed! ",
                                     "[Debug] TOSSpecific::GetBiosID - biosID = 00"));
  EXPECT_THAT(bios.fCalls, ElementsAre(kLoaded));
}

TEST_F(SmbiosStandInTest, AFailedReadOfType1GivesTheDefaultsAndCloses) {
  std::string const structure = StructureFile(SystemInformation("Server Q100 -[1234AB7]-", "KQ12345"));
  for (char const* failure : {"STANDIN_GET_STATUS=3", "STANDIN_GET_STATUS=5", "STANDIN_GET_STATUS=1", "STANDIN_GET_STATUS=-1",
                              "STANDIN_LENGTH=0", "STANDIN_LENGTH=-1", "STANDIN_LENGTH=-2147483648"}) {
    SCOPED_TRACE(failure);
    for (auto const& [operation, result, entered] : {std::tuple("GetMachineType", "0000", "[Debug] getMachineType() entered."),
                                                     std::tuple("name", "Unknown", "[Debug] getMachineInfo() entered.")}) {
      TProbeRun const run = Run(operation, structure + failure);
      EXPECT_EQ(run.fResult, result);
      EXPECT_THAT(run.fLog, ElementsAre(entered, "[Debug] Unable to read DMI structure type 1 from SMBIOS"));
      EXPECT_THAT(run.fCalls, ElementsAre(kLoaded, kGotType1, kClosed));
    }
  }
}

TEST_F(SmbiosStandInTest, AFailedReadOfType0YieldsNoStringEvenWhenTheBufferHoldsOne) {
  std::string const structure = StructureFile(BiosInformation("-[QSE118B-1.10]-"));
  TProbeRun const bios = Run("GetBiosID", structure + "STANDIN_GET_STATUS=3");
  EXPECT_EQ(bios.fResult, "00");
  EXPECT_THAT(bios.fLog, ElementsAre("[Debug] TOSSpecific::GetBiosID - Retrieving first SMBIOS structure",
                                     "[Debug] TOSSpecific::GetBiosID - smbios read operation failed! ",
                                     "[Debug] TOSSpecific::GetBiosID - biosID = 00"));
  EXPECT_THAT(bios.fCalls, ElementsAre(kLoaded, kGotType0, kClosed));

  TProbeRun const type = Run("GetMachineTypeFromID", structure + "STANDIN_GET_STATUS=3");
  EXPECT_EQ(type.fResult, "0000");
  EXPECT_THAT(type.fLog,
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] Unable to read DMI structure type 1 from SMBIOS",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - Retrieving first SMBIOS structure",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - smbios read operation failed! ",
                          "[Debug] TOSSpecific::GetMachineTypeFromID - buildNumber is ",
                          "[Debug] Failed in getting machineType from Bios ID.\nGet machineType from GetMachineType().\n"
                          "machineType=0000"));
}

TEST_F(SmbiosStandInTest, NoMoreItemsOfType0StopsAndCloses) {
  TProbeRun const run = Run("GetBiosID", StructureFile(BiosInformation("-[QSE118B-1.10]-")) + "STANDIN_GET_STATUS=5");
  EXPECT_EQ(run.fResult, "00");
  EXPECT_THAT(run.fLog, ElementsAre("[Debug] TOSSpecific::GetBiosID - Retrieving first SMBIOS structure",
                                    "[Debug] TOSSpecific::GetBiosID - read all smbios structures available for type 0"));
  EXPECT_THAT(run.fCalls, ElementsAre(kLoaded, kGotType0, kClosed));
}

TEST_F(SmbiosStandInTest, AnyOtherStatusOfType0UsesTheBuffer) {
  TProbeRun const run = Run("GetBiosID", StructureFile(BiosInformation("-[QSE118B-1.10]-")) + "STANDIN_GET_STATUS=1");
  EXPECT_EQ(run.fResult, "QS");
}

TEST_F(SmbiosStandInTest, ALengthBeyondTheBufferIsNotTrusted) {
  std::string const structure = StructureFile(SystemInformation("Server Q100 -[1234AB7]-", "KQ12345"));
  for (char const* length : {"1025", "65536", "2147483647"}) {
    SCOPED_TRACE(length);
    TProbeRun const run = Run("SN", structure + "STANDIN_LENGTH=" + length);
    EXPECT_EQ(run.fResult, "KQ12345");
    EXPECT_THAT(run.fCalls, ElementsAre(kLoaded, kGotType1, kClosed));
  }
}

TEST_F(SmbiosStandInTest, AFormattedAreaThatFillsTheBufferHasNoStrings) {
  TProbeRun const run = Run("GetMachineType", StructureFile("\1\xFF"s + std::string(4, '\1')) + "STANDIN_LENGTH=6");
  EXPECT_EQ(run.fResult, "0000");
  EXPECT_THAT(run.fLog, Contains("[Debug] getMachineType() completed."));
}

TEST_F(SmbiosStandInTest, WithoutMemoryForTheBufferTheDefaultsAreGiven) {
#ifdef ZEP_THREAD_SANITIZER
  GTEST_SKIP() << "memory cannot be refused under the thread sanitizer";
#endif
  TProbeRun const type = Run("GetMachineType", "PROBE_NO_MEMORY_FOR=1024");
  EXPECT_EQ(type.fResult, "0000");
  EXPECT_THAT(type.fLog,
              ElementsAre("[Debug] getMachineType() entered.", "[Debug] Unable to allocate memory to hold machineType"));
  EXPECT_THAT(type.fCalls, ElementsAre(kLoaded, kClosed));

  TProbeRun const bios = Run("GetBiosID", "PROBE_NO_MEMORY_FOR=4096");
  EXPECT_EQ(bios.fResult, "00");
  EXPECT_THAT(bios.fLog, ElementsAre("[Debug] GetBiosID: Unable to open SMBIOS lib error = 4"));
}

TEST_F(SmbiosStandInTest, ALibraryWithoutOneOfTheFunctionsIsNotFound) {
  for (char const* variant : {"without-load", "without-get", "without-close"}) {
    SCOPED_TRACE(variant);
    TProbeRun const run = Run("GetMachineType", "", std::string(ZEP_STANDIN_DIR "/") + variant);
    EXPECT_EQ(run.fResult, "0000");
    EXPECT_THAT(run.fLog,
                ElementsAre("[Debug] getMachineType() entered.", "[Debug] getMachineType: Unable to open SMBIOS lib error = 15"));
    EXPECT_TRUE(run.fCalls.empty());
  }
}

TEST_F(SmbiosStandInTest, AFileThatIsNotALibraryCannotBeOpened) {
  WriteFile(fDir.Path("libsmbios.so"), "not a library");
  TProbeRun const run = Run("GetBiosID", "", fDir.Path());
  EXPECT_EQ(run.fResult, "00");
  EXPECT_THAT(run.fLog, ElementsAre("[Debug] GetBiosID: Unable to open SMBIOS lib error = 11"));
}

TEST_F(SmbiosStandInTest, WithoutThePlatformLibraryTheDefaultsAreGiven) {
  std::filesystem::copy(BuildPath("lib/libzepcore.so"), fDir.Path("libzepcore.so"));
  for (auto const& [operation, result] :
       {std::pair("GetMachineType", "0000"), std::pair("GetMachineTypeFromID", "0000"), std::pair("GetBiosID", "00"),
        std::pair("type", "0000"), std::pair("name", "Unknown"), std::pair("model", "Unknown"), std::pair("SN", "Unknown"),
        std::pair("Type", "error param of GetMachineInfo")}) {
    SCOPED_TRACE(operation);
    TProbeRun const run = Run(operation, "", fDir.Path(), fDir.Path());
    EXPECT_EQ(run.fResult, result);
    bool const isBios = std::string("GetBiosID") == operation;
    EXPECT_THAT(run.fLog, Contains(isBios ? "[Debug] GetBiosID: Unable to open SMBIOS lib error = 11"
                                          : "[Debug] getMachineType: Unable to open SMBIOS lib error = 11"));
  }
}

}  // namespace
}  // namespace NQRVZEP20
