// SPDX-License-Identifier: Apache-2.0

// Makes each call that zep makes to the C library, and each of its allocations, fail in turn, and kills it at each of them
// (Faults.cpp). Whatever fails, zep ends by itself and soon, with a documented exit status and a message, and leaves neither
// processes nor parts of files.
//
// Of each function, two calls fail, spread over the run; ZEP_FAULT_CALLS=NUMBER sets how many (scripts/faults).

#include "tests/Support.h"
#include "tests/tools/zep/bundle/Certificates.h"

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <map>
#include <set>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using TWords = std::vector<std::string>;

enum class EOutput { kText, kDocument, kLines };

struct TCommand {
  std::string fName;
  TWords fArguments;
  EOutput fOutput;
  std::string fFile = {};        // the file that it writes
  bool fOnEmptyMachine = false;  // it reads a machine without files
};

void PrintTo(TCommand const& command, std::ostream* stream) { *stream << command.fName; }

TCommand const kCommands[] = {
    {"Report", {"report", "--sample"}, EOutput::kText},
    {"ReportAsDocument", {"report", "--sample", "--json"}, EOutput::kDocument},
    {"ReportAsLines", {"report", "--sample", "--format", "jsonl"}, EOutput::kLines},
    {"ReportInProcess", {"report", "--sample", "--in-process", "--json"}, EOutput::kDocument},
    {"ReportAsPage", {"report", "--sample", "--html", "page.html"}, EOutput::kText, "page.html"},
    {"StoredReport", {"report", "--from", "stored.json", "--html", "page.html"}, EOutput::kText, "page.html"},
    {"RedactedReport", {"report", "--sample", "--redact", "--redaction-map", "map", "--json"}, EOutput::kDocument, "map"},
    {"Unredact", {"unredact", "redacted.json", "--map", "its-map", "--json"}, EOutput::kDocument},
    {"Record", {"record", "new.rec", "--json"}, EOutput::kDocument, "new.rec", true},
    {"Replay", {"report", "--replay", "stored.rec", "--json"}, EOutput::kDocument},
    {"Bundle", {"report", "--bundle", "new.bundle", "--sign", "key", "--json"}, EOutput::kDocument, "new.bundle", true},
    {"Verify", {"verify", "stored.bundle", "--signer", "key", "--json"}, EOutput::kDocument},
    {"Diff", {"diff", "stored.json", "stored.json", "--json"}, EOutput::kDocument},
    {"Show", {"show", "--sample", "CIM_Chassis", "--json"}, EOutput::kDocument},
    {"Mof", {"mof", "schema.mof", "--json"}, EOutput::kDocument},
    {"Config", {"config", "--json"}, EOutput::kDocument},
    {"Run", {"run", "/bin/echo", "words"}, EOutput::kText},
    {"NewPlugIn", {"plugin", "new", "Disks", "--class", "X_Disk", "--mof", "schema.mof"}, EOutput::kText, "Disks"},
    {"Send", {"send", "schema.mof", "ftp://127.0.0.1:9/"}, EOutput::kText},
    {"Help", {"help", "report"}, EOutput::kText},
};

struct TFault {
  std::string fFunction;
  int fNumber, fError;
};

void PrintTo(TFault const& fault, std::ostream* stream) {
  *stream << fault.fFunction << ":" << fault.fNumber << ":" << fault.fError;
}

struct TEnd {
  int fStatus;  // the exit status, or minus the signal
  std::string fOutput, fErrors;
  std::set<std::string> fFiles;  // those that the run made
  std::string fMade;             // the contents of the file of the command
  bool fFired;
  std::map<std::string, int> fCalls;
};

void Redirect(std::string const& file, int descriptor) {
  int const fd = ::open(file.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0666);
  if (fd < 0 || ::dup2(fd, descriptor) < 0) ::_exit(126);
}

[[noreturn]] void Exec(TTempDir const& dir, TCommand const& command, std::string const& fault) {
  Redirect(dir.Path("out"), STDOUT_FILENO);
  Redirect(dir.Path("err"), STDERR_FILENO);
  ::close(STDIN_FILENO);
  ::open("/dev/null", O_RDONLY);
  if (::chdir(dir.Path("work").c_str()) != 0) ::_exit(126);
  ::setenv("LD_PRELOAD", ZEP_FAULTS, 1);
  ::setenv("ZEP_FAULT", fault.c_str(), 1);
  ::setenv("ZEP_FAULT_REPORT", dir.Path("calls").c_str(), 1);
  ::setenv("TMPDIR", dir.Path("work").c_str(), 1);
  if (command.fOnEmptyMachine) ::setenv("ZEP_ROOT", dir.Path("machine").c_str(), 1);
  std::vector<char*> arguments = {const_cast<char*>("zep")};
  for (std::string const& argument : command.fArguments) arguments.push_back(const_cast<char*>(argument.c_str()));
  arguments.push_back(nullptr);
  ::alarm(60);  // a hang ends with SIGALRM
  ::execv(ZEP_PROGRAM, arguments.data());
  ::_exit(127);
}

// The processes that the run left end soon, or never. This process is their parent then.
void ExpectNoProcess() {
  for (int turns = 0; turns < 500; ++turns) {
    pid_t const ended = ::waitpid(-1, nullptr, WNOHANG);
    if (ended < 0) return;
    if (ended == 0) ::usleep(10000);
  }
  ADD_FAILURE() << "a process is left";
}

std::set<std::string> NamesIn(std::string const& directory) {
  std::set<std::string> names;
  for (fs::directory_entry const& entry : fs::directory_iterator(directory)) names.insert(entry.path().filename());
  return names;
}

void ReadCalls(std::string const& file, TEnd& end) {
  std::ifstream report(file);
  std::string word;
  for (int count; report >> word;)
    if (word == "fault")
      end.fFired = true;
    else if (report >> count)
      end.fCalls[word] = count;
}

// The files that commands read, by name. Only their owner may read a map.
using TInputs = std::map<std::string, std::string>;

TEnd EndOf(TCommand const& command, std::string const& fault, TInputs const& inputs) {
  TTempDir const dir;
  fs::create_directory(dir.Path("work"));
  fs::create_directory(dir.Path("machine"));
  WriteFile(dir.Path("work/schema.mof"), "class X_Disk { [Key] string Name; uint64 Size; };\n");
  WriteFile(dir.Path("work/zep.cfg"), "a=1\n");
  for (auto const& [name, text] : inputs) {
    WriteFile(dir.Path("work/" + name), text);
    fs::permissions(dir.Path("work/" + name), fs::perms::owner_read | fs::perms::owner_write);
  }
  std::set<std::string> const before = NamesIn(dir.Path("work"));
  pid_t const child = ::fork();
  if (child == 0) Exec(dir, command, fault);
  int status = 0;
  ::waitpid(child, &status, 0);
  ExpectNoProcess();

  TEnd end{WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status),
           ReadFile(dir.Path("out")),
           ReadFile(dir.Path("err")),
           {},
           "",
           false,
           {}};
  for (std::string const& name : NamesIn(dir.Path("work")))
    if (before.count(name) == 0) end.fFiles.insert(name);
  std::string const made = dir.Path("work/" + command.fFile);
  if (fs::is_regular_file(made)) end.fMade = ReadFile(made);
  ReadCalls(dir.Path("calls"), end);
  return end;
}

// The errors of the call that occur in practice. -1: half of the bytes are written.
std::vector<int> ErrorsOf(std::string const& function) {
  static std::map<std::string, std::vector<int>> const errors = {
      {"any", {-SIGKILL}},   {"memory", {ENOMEM}}, {"read", {EIO, EINTR}},  {"write", {ENOSPC, EINTR, -1}},
      {"writev", {ENOSPC}},  {"open", {EMFILE}},   {"openat", {EMFILE}},    {"fork", {EAGAIN}},
      {"vfork", {EAGAIN}},   {"pipe2", {EMFILE}},  {"poll", {EINTR}},       {"ppoll", {EINTR}},
      {"select", {EINTR}},   {"waitpid", {EINTR}}, {"close", {EINTR}},      {"socket", {EMFILE}},
      {"dup2", {EINTR}},     {"setenv", {ENOMEM}}, {"sigaction", {EINVAL}}, {"dup", {EMFILE}},
      {"mkstemp", {EACCES}}, {"mkdir", {ENOSPC}},  {"rename", {EIO}},       {"fsync", {EIO, ENOSPC}},
  };
  auto const found = errors.find(function);
  return found != errors.end() ? found->second : std::vector<int>{EIO};
}

int CallsToFail() {
  char const* const number = ::getenv("ZEP_FAULT_CALLS");
  return number != nullptr ? std::max(1, std::atoi(number)) : 2;
}

std::vector<TFault> FaultsOf(std::map<std::string, int> const& calls) {
  std::vector<TFault> faults;
  for (auto const& [function, count] : calls) {
    int const step = std::max(1, count / CallsToFail());
    for (int number = 1; number <= count; number += step)
      for (int const error : ErrorsOf(function)) faults.push_back({function, number, error});
  }
  return faults;
}

// A document that is complete, and says how zep ended. Memory may also run out after it was printed.
void ExpectDocument(TEnd const& end, TFault const& fault) {
  nlohmann::json const document = nlohmann::json::parse(end.fOutput, nullptr, false);
  bool const isCut = fault.fFunction == "write" || fault.fFunction == "memory";
  if (document.is_discarded()) {
    EXPECT_TRUE(isCut && end.fStatus != 0 && !end.fErrors.empty()) << end.fOutput;
  } else if (fault.fFunction != "memory" || end.fStatus == 0) {
    EXPECT_EQ(document.at("exitStatus"), end.fStatus);
  }
}

void ExpectWholePage(TEnd const& end) {
  if (end.fFiles.count("page.html") == 0) return;
  EXPECT_EQ(end.fMade.compare(0, 15, "<!DOCTYPE html>"), 0);
  EXPECT_NE(end.fMade.find("</html>"), std::string::npos);
}

void ExpectWholeBundle(TEnd const& end) {
  if (end.fFiles.count("new.bundle") == 0) return;
  TEnd const check = EndOf({"", {"verify", "new.bundle"}, EOutput::kText}, "", {{"new.bundle", end.fMade}});
  EXPECT_EQ(check.fStatus, 0) << check.fOutput << check.fErrors;
}

void ExpectGoodEnd(TCommand const& command, TEnd const& end, TFault const& fault, TEnd const& usual) {
  static std::set<int> const documented = {0, 1, 2, 64, 66, 68, 69, 73, 75};
  if (fault.fError == -SIGKILL) {
    EXPECT_TRUE(end.fStatus == -SIGKILL || documented.count(end.fStatus) != 0) << end.fStatus;
    ExpectWholePage(end);
    ExpectWholeBundle(end);
    return;
  }
  if (end.fErrors.find("in libarchive: ") != std::string::npos) return;  // it ends a program without memory
  EXPECT_EQ(documented.count(end.fStatus), 1u) << end.fStatus << "\n" << end.fErrors;
  EXPECT_TRUE(end.fStatus == usual.fStatus || !end.fErrors.empty() || end.fOutput != usual.fOutput || end.fMade != usual.fMade)
      << "no message";
  if (command.fOutput == EOutput::kDocument) ExpectDocument(end, fault);
  EXPECT_TRUE(command.fFile.empty() || end.fStatus != 0 || end.fFiles.count(command.fFile) == 1) << "no file";
  for (std::string const& file : end.fFiles) {
    bool const isLock = file == command.fFile + ".lock";  // an empty lock may be left, and is used again
    bool const isNamed = end.fErrors.find(file + " cannot be removed") != end.fErrors.npos;
    EXPECT_TRUE(file == command.fFile || isLock || isNamed) << file << " is left";
  }
  ExpectWholePage(end);
}

// A private key with its certificate.
std::string SigningKey() {
  TTempDir const dir;
  zep::TIdentity const identity(dir, "alice");
  return ReadFile(identity.fCertificateFile) + ReadFile(identity.fKeyFile);
}

// A report, the same redacted with its map, a recording, and a signed bundle with its key.
TInputs MakeInputs() {
  TEnd const redacted =
      EndOf({"", {"report", "--sample", "--redact", "--redaction-map", "map", "--json"}, EOutput::kDocument, "map"}, "", {});
  std::string const key = SigningKey();
  TWords const bundle = {"report", "--sample", "--bundle", "new.bundle", "--sign", "key"};
  return {{"key", key},
          {"stored.bundle", EndOf({"", bundle, EOutput::kText, "new.bundle"}, "", {{"key", key}}).fMade},
          {"stored.json", EndOf(kCommands[1], "", {}).fOutput},
          {"redacted.json", redacted.fOutput},
          {"its-map", redacted.fMade},
          {"stored.rec", ReadFile(SourcePath("fuzz/seeds/Recording/small.rec"))}};
}

class ZepFaultsTest : public testing::TestWithParam<TCommand> {
protected:
  void SetUp() override { ASSERT_EQ(::prctl(PR_SET_CHILD_SUBREAPER, 1), 0); }
};

TEST_P(ZepFaultsTest, EndsWellWhateverFails) {
  TCommand const& command = GetParam();
  TInputs const inputs = MakeInputs();
  TEnd const usual = EndOf(command, "", inputs);
  ExpectGoodEnd(command, usual, {"", 0, 0}, usual);
  int fired = 0;
  std::vector<TFault> const faults = FaultsOf(usual.fCalls);
  for (TFault const& fault : faults) {
    SCOPED_TRACE(testing::PrintToString(fault));
    TEnd const end =
        EndOf(command, fault.fFunction + ":" + std::to_string(fault.fNumber) + ":" + std::to_string(fault.fError), inputs);
    ExpectGoodEnd(command, end, fault, usual);
    fired += end.fFired || end.fStatus < 0 ? 1 : 0;
  }
  EXPECT_GT(fired, static_cast<int>(faults.size()) / 2);  // where processes run in parallel, a later call may not be reached
}

INSTANTIATE_TEST_SUITE_P(All, ZepFaultsTest, testing::ValuesIn(kCommands), [](auto const& tested) { return tested.param.fName; });

}  // namespace
}  // namespace NQRVZEP20
