// SPDX-License-Identifier: Apache-2.0

// Makes every call that a host service makes to the C library fail, one after the other (tests/faults). The operation must
// report the correct result, leak nothing, and end.

#include "tests/os/HostTools.h"
#include "tests/os/Programs.h"

#include <cerrno>
#include <map>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using TLines = std::vector<std::string>;

struct TOutcome {
  TLines fLines;                      // the result, the log entries, the leaks
  std::map<std::string, int> fCalls;  // of which function, and how many
  bool fFired;
};

// Runs one operation in a private directory, with a fault (FUNCTION:NUMBER:ERRNO) or without one.
TOutcome Do(std::string const& operation, std::string const& fault = "") {
  TTempDir const dir;
  WriteFile(dir.Path("small"), "0123456789");
  WriteFile(dir.Path("large"), std::string(2000000, 'x'));
  WriteFile(dir.Path("zep.cfg"), "a=1\nb=2");
  fs::create_directories(dir.Path("tree/below"));
  WriteFile(dir.Path("tree/below/file"), "text");
  fs::create_directories(dir.Path("bin"));
  for (char const* command : {"bin/cp", "bin/vi"}) {  // stand-ins that do nothing
    WriteFile(dir.Path(command), "#!/bin/sh\n");
    fs::permissions(dir.Path(command), fs::perms::all);
  }

  std::string const program = BuildPath("tests/programs/FaultyOperation") + " " + operation;
  TProgramRun const run = RunProgram("cd " + dir.Path() + " && PATH=" + dir.Path("bin") + ":$PATH ZEP_FAULT=" + fault +
                                     " LD_PRELOAD=" ZEP_FAULTS " timeout 30 " + program + " < /dev/null 2> /dev/null");
  TOutcome outcome{{}, {}, false};
  if (run.fExitCode != 0) outcome.fLines.push_back("exit code " + std::to_string(run.fExitCode));
  std::istringstream output(run.fOutput);
  std::string line;
  while (std::getline(output, line) && line != "calls") {
    if (line == "fault")
      outcome.fFired = true;
    else
      outcome.fLines.push_back(line);
  }
  std::string function;
  for (int count; output >> function >> count;) outcome.fCalls[function] = count;
  return outcome;
}

struct TFault {
  std::string fFunction;  // "child." for a child before its exec
  std::string fNumber;    // the number of the call, or "all"
  int fError;             // an errno; for write also 0 (nothing is written) and -1 (half is written)
  TLines fLines;
};

struct TOperation {
  std::string fName;
  TLines fLines;  // the result without a fault
  std::vector<TFault> fFaults;
};

void PrintTo(TOperation const& operation, std::ostream* stream) { *stream << operation.fName; }

std::string const kChild = Child("PrintsArguments");

// The faults of starting, reading and waiting for a child, for every operation that does so. Each operation gives its results
// for a successful child, for one that is left or fails after its output was read, and for one that fails before.
std::vector<TFault> SpawnFaults(TLines const& log, std::string const& good, std::string const& badWithOutput,
                                std::string const& badWithout, std::string const& goodWithout) {
  auto const with = [&log](std::string const& result, TLines const& more = {}) {
    TLines lines{result};
    lines.insert(lines.end(), log.begin(), log.end());
    lines.insert(lines.end(), more.begin(), more.end());
    return lines;
  };
  return {
      {"pipe2", "1", EMFILE, with(badWithout, {"[Debug] ERROR: SpawnProcess - pipe call failed!"})},
      {"vfork", "1", EAGAIN, with("threw kZEPStatusFail", {"[Error] ERROR: Fork failed"})},
      {"close", "all", EINTR, with(good)},
      {"select", "1", EINTR, with(badWithout, {"[Debug] ERROR: SpawnProcess - select call failed!", "a child left"})},
      {"select", "2", EINTR, with(badWithOutput, {"[Debug] ERROR: SpawnProcess - select call failed!", "a child left"})},
      {"read", "all", EINTR, with(good)},  // appends nothing; the next read succeeds
      {"waitpid", "1", ECHILD, with(badWithOutput, {"[Debug] ERROR: SpawnProcess - waitpid call failed!", "a child left"})},
      {"child.close", "all", EINTR, with(good)},
      {"child.dup2", "1", EINTR, with(goodWithout)},  // its output goes nowhere
      {"child.dup2", "2", EINTR, with(good)},
      {"child.sigaction", "all", EINVAL, with(good)},
  };
}

std::vector<TFault> operator+(std::vector<TFault> faults, std::vector<TFault> const& more) {
  faults.insert(faults.end(), more.begin(), more.end());
  return faults;
}

std::vector<TOperation> Operations() {
  std::string const path = "[" + kChild + "]";
  std::string const spawn = "[Debug] SpawnProcess: process " + kChild, spawnFind = "[Debug] SpawnProcess: process find";
  TLines const spawnWithEnvironment = {"[Debug] TOSSpecific::SpawnProcess calling " + kChild, "with parameters " + kChild + " ",
                                       "with envoirment vars A=1 "};
  std::string const fileError = "threw kZEPStatusFileSystemError", notFound = "threw kZEPStatusFileNotFound";
  std::string const returned = "[Debug] Debug (linux toss): GetFileContents() Returned: 0123456789";
  std::string const returnedLarge =
      ("[Debug] Debug (linux toss): GetFileContents() Returned: " + std::string(500, 'x')).substr(0, 500);
  std::string const readFailed = "[Status] GetFileContents failed to read file small";
  std::string const captureFailed = "[Error] failed to capture file content due to exception: ";
  std::string const deleting = "[Debug] Entering TOSSpecific::deleteFile, path=small",
                    deleted = "[Debug] Exiting TOSSpecific::deleteFile";
  TLines const created = {"[Debug] Entering TOSSpecific::createFile, path=new", "[Debug] Successfully created file: new",
                          "[Debug] Exiting TOSSpecific::createFile"};
  std::string const opening = "[Debug] TOSSpecific::OpenOutputFileStream -- Entering ";
  std::string const openFailed = "[Error] TOSSpecific::OpenOutputFileStream --  Failed to open output file: new";
  std::string const parsing = "[Debug] TConfig::parseConfigFile(): start to parse config file";
  std::string const missing = "[Error] TConfig::parseConfigFile(): config file doesn't exist";
  std::string const readingFailed = "[Error] TConfig::parseConfigFile(): Read config file zep.cfg failed";
  std::string const noTransfer = "threw kZEPStatusLibCurlFailure";
  std::string const uploadFailed =
      "[Error] TOSSpecific|CurlTransferFile: Error performing command: the local file cannot be read to its end";
  std::string const mapIsEmpty = "[Error] TConfig::getValue(): map is empty";

  return {
      {"SpawnProcess",
       {"0 " + path, spawn},
       SpawnFaults({spawn}, "0 " + path, "-1 " + path, "-1 ", "0 ") +
           std::vector<TFault>{{"child.execvp", "1", ENOENT, {"-1 ", spawn}}}},
      {"SpawnProcessWithEnvironment",
       {"0 " + path, spawnWithEnvironment[0], spawnWithEnvironment[1], spawnWithEnvironment[2]},
       SpawnFaults(spawnWithEnvironment, "0 " + path, "-1 " + path, "-1 ", "0 ") +
           std::vector<TFault>{{"child.execve",
                                "1",
                                ENOENT,
                                {"-1 ", spawnWithEnvironment[0], spawnWithEnvironment[1], spawnWithEnvironment[2]}}}},
      {"FindFile",
       {"tree/below/file", spawnFind},
       SpawnFaults({spawnFind}, "tree/below/file", "tree/below/file", "", "") +
           std::vector<TFault>{
               {"child.execvp", "1", ENOENT, {"", spawnFind}},
               {"select", "1", 0, {"", spawnFind, "[Debug] ERROR: SpawnProcess - find TimeOut!", "a child left"}}}},
      {"CapFileViaProc",
       {"0123456789", spawn, returned},
       {{"pipe2", "1", EMFILE, {"0123456789", spawn, "[Debug] ERROR: SpawnProcess - pipe call failed!", returned}},
        {"vfork", "1", EAGAIN, {"", spawn, "[Error] ERROR: Fork failed", captureFailed + "kZEPStatusFail"}},
        {"close", "all", EINTR, {"0123456789", spawn, returned}},
        {"select",
         "1",
         EINTR,
         {"0123456789", spawn, "[Debug] ERROR: SpawnProcess - select call failed!", returned, "a child left"}},
        {"select",
         "1",
         0,
         {"0123456789", spawn, "[Debug] ERROR: SpawnProcess - " + kChild + " TimeOut!", returned, "a child left"}},
        {"waitpid",
         "1",
         ECHILD,
         {"0123456789", spawn, "[Debug] ERROR: SpawnProcess - waitpid call failed!", returned, "a child left"}},
        {"child.close", "all", EINTR, {"0123456789", spawn, returned}},
        {"child.dup2", "all", EINTR, {"0123456789", spawn, returned}},
        {"child.sigaction", "all", EINTR, {"0123456789", spawn, returned}},
        {"child.execvp", "1", ENOENT, {"0123456789", spawn, returned}},
        {"open",
         "1",
         EACCES,
         {"", spawn, "[Error] ERROR: CaptureFile failed to open: small", captureFailed + "kZEPStatusFileNotFound"}},
        {"fstat", "1", EIO, {"0123456789", spawn, returned}},
        {"read", "1", EIO, {"0123456789", spawn, returned}},
        {"read", "3", EIO, {"", spawn, readFailed, captureFailed + "kZEPStatusFileSystemError"}},
        {"read", "4", EIO, {"", spawn, readFailed, captureFailed + "kZEPStatusFileSystemError"}}}},
      {"CaptureFile",
       {"0123456789", returned},
       {{"open", "1", EACCES, {notFound, "[Error] ERROR: CaptureFile failed to open: small"}},
        {"fstat", "1", EIO, {"0123456789", returned}},
        {"read", "all", EIO, {fileError, readFailed}},
        {"close", "1", EINTR, {"0123456789", returned}}}},
      {"CaptureFileOfSeveralReads",
       {"2000000", returnedLarge},
       {{"open", "1", EMFILE, {notFound, "[Error] ERROR: CaptureFile failed to open: large"}},
        {"fstat", "1", EIO, {"2000000", returnedLarge}},
        {"read", "2", EINTR, {fileError, "[Status] GetFileContents failed to read file large"}},
        {"read", "all", EIO, {fileError, "[Status] GetFileContents failed to read file large"}},
        {"close", "1", EINTR, {"2000000", returnedLarge}}}},
      {"CaptureFileLoader",
       {"0123456789", returned},
       {{"open",
         "1",
         EACCES,
         {"", "[Debug] CaptureFile failed to open: small",
          "[Debug] Please confirm that the related software/driver is properly installed."}},
        {"fstat", "1", EIO, {"0123456789", returned}},
        {"read", "all", EIO, {fileError, readFailed}},
        {"close", "1", EINTR, {"0123456789", returned}}}},
      {"LaunchTextEditor", {"done"}, {{"getcwd", "1", ERANGE, {"done"}}, {"system", "all", EAGAIN, {"done"}}}},
      {"GetFileSize", {"10"}, {{"stat", "all", EACCES, {notFound}}}},
      {"FileCopy",
       {"copied, 0123456789"},
       {{"stat", "1", EACCES, {fileError}},
        {"open", "all", EACCES, {fileError}},
        {"read", "1", EIO, {fileError}},
        {"read", "2", EIO, {fileError + ", 0123456789"}},
        {"write", "1", ENOSPC, {fileError}},
        {"write", "1", 0, {"copied"}},          // a write of nothing ends the copy, and its result is 0
        {"write", "1", -1, {"copied, 01234"}},  // a short write is not continued
        {"close", "all", EIO, {"copied, 0123456789"}}}},
      {"FileCopyOfALargeFile",
       {"copied, all"},
       {{"stat", "1", EACCES, {fileError + ", not all"}},
        {"open", "all", EACCES, {fileError + ", not all"}},
        {"copy_file_range", "all", EXDEV, {"copied, all"}},  // data that the kernel cannot copy are read and written
        {"read", "all", EIO, {fileError + ", all"}},
        {"lseek", "all", EIO, {fileError + ", all"}},
        {"write", "1", ENOSPC, {fileError + ", all"}},  // the last chunk, which is written again
        {"close", "all", EIO, {"copied, all"}}}},
      {"DirCopy",
       {"0, text"},
       {{"opendir", "all", EMFILE, {fileError}},
        {"stat", "1", EIO, {"0, text"}},  // the check whether the destination exists; the destination is then created
        {"stat", "2", EIO, {"0"}},        // the directory in the source: passed over
        {"stat", "3", EIO, {"0, text"}},
        {"stat", "4", EIO, {"0"}},        // the file in that directory, which is skipped
        {"stat", "5", EIO, {fileError}},  // FileCopy's own
        {"mkdir", "1", EACCES, {"threw kZEPStatusAccessDenied"}},
        {"mkdir", "2", ENOSPC, {fileError}},
        {"readdir", "1", EIO, {"0"}},  // treated as the end of the directory
        {"open", "all", EMFILE, {fileError}},
        {"read", "1", EIO, {fileError}},
        {"write", "1", ENOSPC, {fileError}},
        {"close", "all", EIO, {"0, text"}},
        {"closedir", "1", EIO, {"0, text"}},
        {"closedir", "2", EIO, {"-1, text"}}}},
      {"MkDirHier",
       {"made, there"},
       {{"stat", "all", ENOENT, {"made, there"}},  // as if another thread created each directory immediately after the check
        {"mkdir", "1", EEXIST, {"threw kZEPStatusDirectoryAlreadyExists, missing"}},
        {"mkdir", "1", EACCES, {"threw kZEPStatusAccessDenied, missing"}}}},
      {"ListDir",
       {"file"},
       {{"opendir", "1", EMFILE, {fileError}}, {"readdir", "1", EIO, {""}}, {"closedir", "1", EIO, {"file"}}}},
      {"deleteFile", {"true, gone", deleting, deleted}, {{"system", "1", EAGAIN, {"true, there", deleting, deleted}}}},
      {"createFile",
       {"true, text", created[0], created[1], created[2]},
       {{"open", "1", EACCES, {"false", created[0], "[Debug] Unable to create file, errno=13"}},
        {"open", "1", ENOSPC, {"false", created[0], "[Debug] Unable to create file, errno=28"}},
        {"write", "1", ENOSPC, {"true", created[0], created[1], created[2]}},
        {"write", "1", -1, {"true, te", created[0], created[1], created[2]}},
        {"close", "1", EIO, {"true, text", created[0], created[1], created[2]}}}},
      {"OpenOutputFileStream",
       {"opened", opening, "[Debug] TOSSpecific::OpenOutputFileStream -- Exting "},
       {{"fopen64", "1", EACCES, {"threw kZEPStatusAccessDenied", opening, openFailed}},
        {"fopen64", "1", EROFS, {fileError, opening, openFailed}},
        {"fclose", "1", EIO, {"opened", opening, "[Debug] TOSSpecific::OpenOutputFileStream -- Exting "}}}},
      {"GetCurrentDir", {"true"}, {{"getcwd", "1", ERANGE, {"threw kZEPStatusFail"}}}},
      {"PutEnvironment",
       {"true"},
       {{"setenv", "1", ENOMEM, {"false", "[Debug] TOSSpecific debug output: [ERROR]PutEnvironment occured errors."}}}},
      {"IsKeyWaiting",
       {"false"},
       {{"tcgetattr", "1", EIO, {"false"}}, {"tcsetattr", "all", EIO, {"false"}}, {"select", "1", EINTR, {"true"}}}},
      {"GetKeyboardChar",
       {"107"},
       {{"tcgetattr", "1", EIO, {"107"}}, {"tcsetattr", "all", EIO, {"107"}}, {"read", "1", EINTR, {"-1"}}}},
      {"USleep", {"0"}, {{"usleep", "1", EINTR, {"-1"}}}},
      {"LaunchCommandShell", {"0"}, {{"system", "1", EAGAIN, {"-1"}}}},
      {"Upload",
       {"transferred, 0123456789"},
       {{"open", "1", EACCES, {noTransfer, "[Error] TOSSpecific|CurlTransferFile: Error getting file size"}},
        {"fstat", "1", EIO, {noTransfer, "[Error] TOSSpecific|CurlTransferFile: Error getting file size"}},
        {"close", "all", EIO, {"transferred, 0123456789"}},
        {"fopen", "1", EMFILE, {noTransfer, "[Error] TOSSpecific|CurlTransferFile: Error creating file stream"}},
        {"fread", "1", EBADF, {"threw kZEPStatusAccessDenied", uploadFailed}},
        {"fclose", "1", EIO, {"transferred, 0123456789"}}}},
      {"UploadOfSeveralReads",
       {"transferred, 2000000 bytes"},
       {{"open", "1", EACCES, {noTransfer + ", 0 bytes", "[Error] TOSSpecific|CurlTransferFile: Error getting file size"}},
        {"fstat", "1", EIO, {noTransfer + ", 0 bytes", "[Error] TOSSpecific|CurlTransferFile: Error getting file size"}},
        {"close", "all", EIO, {"transferred, 2000000 bytes"}},
        {"fopen", "1", EMFILE, {noTransfer + ", 0 bytes", "[Error] TOSSpecific|CurlTransferFile: Error creating file stream"}},
        {"fclose", "1", EIO, {"transferred, 2000000 bytes"}},
        {"fread", "1", EBADF, {"threw kZEPStatusAccessDenied, 0 bytes", uploadFailed}},
        {"fread", "1001", EBADF, {"threw kZEPStatusAccessDenied, 1000000 bytes", uploadFailed}}}},
      {"Download",
       {"transferred, first second"},
       {{"fopen", "1", EACCES, {"transferred, first second"}},  // the check whether the file exists
        {"fopen",
         "2",
         EACCES,
         {"threw kZEPStatusAccessDenied", "[Error] TOSSpecific|CurlTransferFile: Error performing command: "}},
        {"fopen",
         "3",
         EMFILE,
         {"threw kZEPStatusAccessDenied, first ", "[Error] TOSSpecific|CurlTransferFile: Error performing command: "}},
        {"fclose",  // a full disk that is detected only then
         "1",
         ENOSPC,
         {"threw kZEPStatusAccessDenied, first ", "[Error] TOSSpecific|CurlTransferFile: Error performing command: "}},
        {"fclose",
         "2",
         ENOSPC,
         {"threw kZEPStatusAccessDenied, first second", "[Error] TOSSpecific|CurlTransferFile: Error performing command: "}}}},
      {"TConfig",
       {"a,b", parsing},
       {{"stat", "all", EACCES, {"", parsing, missing, mapIsEmpty}},
        {"fopen64", "1", EACCES, {"", parsing, mapIsEmpty}},
        {"fclose", "1", EIO, {"a,b", parsing}},
        {"read", "all", EIO, {"", parsing, readingFailed, mapIsEmpty}}}},
      {"TConfigOfSeveralReads",
       {"2000", parsing},
       {{"stat", "all", EACCES, {"0", parsing, missing, mapIsEmpty}},
        {"fopen64", "1", EACCES, {"0", parsing, mapIsEmpty}},
        {"fclose", "1", EIO, {"2000", parsing}},
        {"read", "2", EIO, {"0", parsing, readingFailed, mapIsEmpty}}}},
      {"TConfigReadAgain",
       {"a,b", parsing, parsing},
       {{"stat", "all", EACCES, {"b", parsing, parsing, missing}},
        {"fopen64", "1", EACCES, {"b", parsing, parsing}},
        {"fclose", "1", EIO, {"a,b", parsing, parsing}},
        {"read", "all", EIO, {"b", parsing, parsing, readingFailed}}}},  // the previous settings are kept
  };
}

class HostFaultsTest : public testing::TestWithParam<TOperation> {};

TEST_P(HostFaultsTest, EveryCallFailsInTurn) {
  TOutcome const clean = Do(GetParam().fName);
  EXPECT_EQ(clean.fLines, GetParam().fLines);
  EXPECT_FALSE(clean.fFired);

  std::map<std::string, int> untried = clean.fCalls;
  for (TFault const& fault : GetParam().fFaults) {
    untried.erase(fault.fFunction);
    int const calls = clean.fCalls.count(fault.fFunction) ? clean.fCalls.at(fault.fFunction) : 0;
    EXPECT_TRUE(calls > 0 || kIsSanitized) << fault.fFunction << " is not called";
    // Of many calls with the same result, only the first, the second and the last are made to fail.
    for (int number = 1; number <= calls; ++number) {
      if (fault.fNumber == "all" ? number > 2 && number < calls : fault.fNumber != std::to_string(number)) continue;
      std::string const name = fault.fFunction + ":" + std::to_string(number) + ":" + std::to_string(fault.fError);
      SCOPED_TRACE(name);
      TOutcome const outcome = Do(GetParam().fName, name);
      EXPECT_TRUE(outcome.fFired);
      EXPECT_EQ(outcome.fLines, fault.fLines);
    }
  }
  for (auto const& [function, calls] : untried) ADD_FAILURE() << function << " is called " << calls << " times and never failed";
}

INSTANTIATE_TEST_SUITE_P(Operations, HostFaultsTest, testing::ValuesIn(Operations()),
                         [](auto const& operation) { return operation.param.fName; });

TEST(HostFaultsWithoutMemoryTest, AConfigurationThatCannotBeOpenedForLackOfMemoryIsLogged) {
  EXPECT_EQ(Do("TConfigWithoutMemory").fLines, (TLines{"", "[Debug] TConfig::parseConfigFile(): start to parse config file",
                                                       "[Error] TConfig::parseConfigFile(): Open config file zep.cfg failed",
                                                       "[Error] TConfig::getValue(): map is empty"}));
}

}  // namespace
}  // namespace NQRVZEP20
