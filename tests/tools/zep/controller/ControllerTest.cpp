// SPDX-License-Identifier: Apache-2.0

// Tests zep remote without a controller: its arguments, the sources of the password, and its output.

#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"
#include "tools/zep/controller/Controller.h"

#include <gmock/gmock.h>
#include <poll.h>
#include <pty.h>
#include <sys/prctl.h>
#include <sys/ptrace.h>
#include <sys/stat.h>

#include <string>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;

std::string const kSaid = "1234\0AB7\0KQ12345\0\0"s;

std::string WithoutHead(TJson document) {
  for (char const* member : {"document", "version", "zep", "sample", "exitStatus", "reason"}) document.erase(member);
  return document.dump();
}

TEST(InventoryLimitsTest, TheTimeOfTheSessionIsSubtracted) {
  using namespace std::chrono_literals;
  TInventoryLimits const limits = {90s, true};
  EXPECT_EQ(limits.After(0s).fTime, 90s);
  EXPECT_EQ(limits.After(30s).fTime, 60s);
  EXPECT_EQ(limits.After(30s + 1us).fTime, 59999ms);
  EXPECT_EQ(limits.After(200s).fTime, 0s);
  EXPECT_TRUE(limits.After(30s).fShowsProgress);
}

TEST(RemoteIdentityTextTest, IsReadFromTheTextThatTheProcessSent) {
  TRemoteIdentity const whole = IdentityFrom("h", kSaid, true);
  EXPECT_TRUE(IsComplete(whole));
  EXPECT_FALSE(IsNothing(whole));
  ExpectEnvelope(AsJson(whole).dump(), 0, "zep remote");
  EXPECT_EQ(WithoutHead(AsJson(whole)), R"({"host":"h","type":"1234","model":"AB7","serialNumber":"KQ12345"})");
  EXPECT_EQ(AsText(whole), "Remote server    h\nMachine type     1234\nModel            AB7\nSerial number    KQ12345\n");

  TRemoteIdentity const part = IdentityFrom("h", "1234\0\0\0why\0"s, true);
  EXPECT_FALSE(IsComplete(part));
  EXPECT_FALSE(IsNothing(part));
  ExpectEnvelope(AsJson(part).dump(), 2, "zep remote");
  EXPECT_EQ(AsJson(part)["reason"], "why");
  EXPECT_EQ(WithoutHead(AsJson(part)), R"({"host":"h","type":"1234","model":null,"serialNumber":null,"error":"why"})");
  EXPECT_EQ(AsText(part), "Remote server    h\nMachine type     1234\nModel            unknown\nSerial number    unknown\n");
}

TEST(RemoteIdentityTextTest, FieldsSentByAProcessThatDidNotFinishAreKept) {
  struct {
    std::string fSent, fType, fModel, fSerialNumber;
  } const rows[] = {
      {"", "", "", ""},
      {"12", "", "", ""},  // a field without its end may be truncated
      {"1234\0AB"s, "1234", "", ""},
      {"1234\0AB7\0"s, "1234", "AB7", ""},
      {kSaid, "1234", "AB7", "KQ12345"},
  };
  for (auto const& row : rows) {
    TRemoteIdentity const identity = IdentityFrom("h", row.fSent, false);
    EXPECT_EQ(identity.fType, row.fType);
    EXPECT_EQ(identity.fModel, row.fModel);
    EXPECT_EQ(identity.fSerialNumber, row.fSerialNumber);
    EXPECT_EQ(identity.fError, "the process that queried the controller exited before it had finished");
  }
}

TEST(RemoteIdentityTextTest, TextOfAControllerIsMadePrintable) {
  TRemoteIdentity const identity = IdentityFrom("h", "12\x1B[2J\0A\xFF\0K\0\0"s, true);
  EXPECT_THAT(AsText(identity), HasSubstr("12\\x1b[2J"));
  EXPECT_THAT(AsText(identity), HasSubstr("A\\xff"));
}

class ZepRemoteTest : public testing::Test {
protected:
  TRun Run(std::vector<std::string> arguments, std::map<std::string, std::string> const& environment = {}) {
    arguments.insert(arguments.begin(), "remote");
    TCall call = {arguments};
    call.fEnvironment = environment;
    call.fHasNoTerminal = true;
    return fZep.Run(call);
  }

  std::string File(std::string const& name, std::string const& text) {
    WriteFile(fZep.Path(name), text);
    return fZep.Path(name);
  }

  static std::string Private(std::string const& file) {
    fs::permissions(file, fs::perms::owner_read | fs::perms::owner_write);
    return file;
  }

  TInstallation fZep;
  std::map<std::string, std::string> const fPassword = {{"ZEP_BMC_PASSWORD", "zeppass1"}};
};

std::string const kNothing =
    "no session with the controller after N s: libipmiClient.so cannot be loaded (libipmiClient.so: cannot open shared object "
    "file: No such file or directory); install the package libzepcore-ipmi";

TEST_F(ZepRemoteTest, WithoutTheClientLibraryNothingIsReported) {
  TRun const run = Run({"192.0.2.1", "--user", "zepadmin"}, fPassword);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput,
            "Remote server    192.0.2.1\nMachine type     unknown\nModel            unknown\nSerial number    unknown\n");
  EXPECT_EQ(run.fErrors, "zep: 192.0.2.1: " + kNothing + "\n");

  TRun const json = Run({"192.0.2.1", "--user", "zepadmin", "--json"}, fPassword);
  EXPECT_EQ(json.fStatus, 1);
  EXPECT_EQ(JsonOf(json)["document"], "zep remote");
  EXPECT_EQ(JsonOf(json)["host"], "192.0.2.1");
  EXPECT_TRUE(JsonOf(json)["type"].is_null());
  EXPECT_EQ(JsonOf(json)["error"], kNothing);
}

TEST_F(ZepRemoteTest, AListPrintsOneLineForEachHost) {
  std::string const hosts = File("hosts", "# the machine room\n\none\n  two \t\r\n::1\n#\none");
  TRun const run = Run({"--hosts", hosts, "--user", "zepadmin", "--parallel", "1"}, fPassword);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors, "zep: 4 of 4 hosts done, 4 failed\n");
  std::vector<std::string> names;
  for (std::string const& line : LinesOf(run.fOutput)) names.push_back(nlohmann::json::parse(line)["host"]);
  EXPECT_THAT(names, testing::ElementsAre("one", "two", "::1", "one"));
}

TEST_F(ZepRemoteTest, WrongUsageHasItsOwnStatus) {
  std::string const hosts = File("hosts", "one\n");
  std::vector<std::vector<std::string>> const calls = {
      {"--user", "u"},  // no host
      {"host", "--hosts", hosts, "--user", "u"},
      {"host"},  // no user
      {"host", "--user", "u", "--password", "p"},
      {"--hosts", hosts, "--user", "u", "--parallel", "0"},
      {"--hosts", hosts, "--user", "u", "--parallel", "1001"},
      {"--hosts", hosts, "--user", "u", "--timeout", "0"},
      {"host", "--user", "u", "--timeout", "x"},
      {"one", "two", "--user", "u"},
  };
  for (auto const& call : calls) {
    SCOPED_TRACE(testing::PrintToString(call));
    TRun const run = Run(call, fPassword);
    EXPECT_EQ(run.fStatus, 64);
    EXPECT_EQ(run.fOutput, "");
    EXPECT_NE(run.fErrors, "");
  }
}

TEST_F(ZepRemoteTest, AFileOfHostsThatCannotBeUsedIsReported) {
  std::string const absent = fZep.Path("absent"), empty = File("empty", "\n# nothing\n \n");
  TRun const without = Run({"--hosts", absent, "--user", "u"}, fPassword);
  EXPECT_EQ(without.fStatus, 1);
  EXPECT_EQ(without.fErrors, "zep: " + absent + " cannot be read: No such file or directory\n");
  EXPECT_EQ(Run({"--hosts", empty, "--user", "u"}, fPassword).fErrors, "zep: " + empty + " contains no host\n");
}

TEST_F(ZepRemoteTest, AReadErrorInTheFileOfHostsIsNotTheEndOfTheFile) {
  struct TRow {
    std::string fPath, fReason;
  };
  for (TRow const& row : {TRow{fZep.Path("lib"), "Is a directory"}, TRow{"/proc/self/mem", "Input/output error"}}) {
    TRun const run = Run({"--hosts", row.fPath, "--user", "u"}, fPassword);
    EXPECT_EQ(run.fStatus, 1);
    EXPECT_EQ(run.fOutput, "");
    EXPECT_EQ(run.fErrors, "zep: " + row.fPath + " cannot be read: " + row.fReason + "\n");
  }
}

TEST_F(ZepRemoteTest, WithoutATerminalThePasswordNeedsAnotherSource) {
  TRun const run = Run({"host", "--user", "u"});
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fErrors,
            "zep: there is no terminal on which to prompt for the password: set ZEP_BMC_PASSWORD or use --password-file\n");
  std::string const absent = fZep.Path("absent");
  EXPECT_EQ(Run({"host", "--user", "u", "--password-file", absent}, fPassword).fErrors,
            "zep: the file of --password-file cannot be read: No such file or directory\n");
  EXPECT_EQ(Run({"host", "--user", "u", "--password-file", fZep.Path("lib")}, fPassword).fErrors,
            "zep: " + fZep.Path("lib") + " cannot be read: Is a directory\n");
  std::string const empty = File("empty", "");
  EXPECT_EQ(Run({"host", "--user", "u", "--password-file", empty}, fPassword).fErrors,
            "zep: there is no password in " + empty + "\n");
  EXPECT_EQ(Run({"host", "--user", "u", "--password-file", Private(File("password", "zeppass1\n"))}).fErrors,
            "zep: host: " + kNothing + "\n");
  EXPECT_EQ(Run({"host", "--user", "u"}, {{"ZEP_BMC_PASSWORD", ""}}).fErrors, "zep: host: " + kNothing + "\n")
      << "an empty password is a password";
}

TEST_F(ZepRemoteTest, ADebugLogContainsNoPassword) {
  std::string const log = fZep.Path("log");
  TRun const run = Run({"host", "--user", "u", "--debug-log", log}, fPassword);
  EXPECT_EQ(run.fErrors, "zep: host: " + kNothing + "\n") << "the debug log needs no warning";
  EXPECT_THAT(ReadFile(log), HasSubstr("FDR_[Debug] "));
  EXPECT_EQ((run.fErrors + run.fOutput + ReadFile(log)).find("zeppass1"), std::string::npos);
}

TEST_F(ZepRemoteTest, ADebugLogIsReadableOnlyByItsOwner) {
  std::string const log = File("log", "from before");
  fs::permissions(log, static_cast<fs::perms>(0644));
  Run({"host", "--user", "u", "--debug-log", log}, fPassword);
  EXPECT_EQ(fs::status(log).permissions(), static_cast<fs::perms>(0600));
  EXPECT_EQ(ReadFile(log).find("from before"), std::string::npos);
  Run({"host", "--user", "u", "--debug-log", log + "2"}, fPassword);
  EXPECT_EQ(fs::status(log + "2").permissions(), static_cast<fs::perms>(0600));
}

TEST_F(ZepRemoteTest, ADebugLogMustBeARegularFileOfTheCaller) {
  std::string const victim = File("victim", "untouched"), link = fZep.Path("link"), fifo = fZep.Path("fifo");
  fs::create_symlink(victim, link);
  fs::create_hard_link(victim, fZep.Path("second"));
  ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
  struct TRow {
    std::string fLog, fReason;
  };
  for (TRow const& row : {TRow{link, "it is a symbolic link"}, TRow{fZep.Path("second"), "it has more than one hard link"},
                          TRow{fifo, "it is not a regular file"}, TRow{"/dev/null", "it is not a regular file"}}) {
    TRun const run = Run({"host", "--user", "u", "--debug-log", row.fLog}, fPassword);
    EXPECT_EQ(run.fStatus, 1);
    EXPECT_EQ(run.fErrors, "zep: the debug log " + row.fLog + " cannot be written: " + row.fReason + "\n");
  }
  EXPECT_EQ(ReadFile(victim), "untouched");
}

TEST_F(ZepRemoteTest, AFileOfAnotherUserIsRefusedAsDebugLog) {
  NEEDS(::geteuid() == 0, "root, who may write another user's file");
  std::string const log = File("log", "untouched");
  ASSERT_EQ(::chown(log.c_str(), 65534, 65534), 0);
  EXPECT_EQ(Run({"host", "--user", "u", "--debug-log", log}, fPassword).fErrors,
            "zep: the debug log " + log + " cannot be written: it belongs to another user\n");
  EXPECT_EQ(ReadFile(log), "untouched");
}

TEST_F(ZepRemoteTest, APasswordFileReadableByEveryUserCausesAWarning) {
  std::string const file = File("password", "zeppass1\n");
  fs::permissions(file, static_cast<fs::perms>(0644));
  TRun const run = Run({"host", "--user", "u", "--password-file", file});
  EXPECT_EQ(run.fErrors, "zep: warning: every user may read the passwords in " + file +
                             " (mode 0644); chmod 600 makes it private\nzep: host: " + kNothing + "\n");
  fs::permissions(file, static_cast<fs::perms>(0640));
  EXPECT_EQ(Run({"host", "--user", "u", "--password-file", file}).fErrors, "zep: host: " + kNothing + "\n");
}

TEST_F(ZepRemoteTest, AHostWithAPasswordIsNotQueried) {
  TRun const run = Run({"admin:topsecret@host", "--user", "u", "--json"}, fPassword);
  EXPECT_EQ(run.fStatus, 64);
  EXPECT_THAT(run.fErrors, HasSubstr("zep: the host is not a host name or address; "));
  TRun const list = Run({"--hosts", File("hosts", "admin:topsecret@host\n"), "--user", "u"}, fPassword);
  EXPECT_EQ(list.fStatus, 1);
  EXPECT_THAT(list.fOutput, HasSubstr("line 1 of "));
  EXPECT_THAT(list.fOutput, HasSubstr("not a host name or address; "));
  EXPECT_THAT(list.fOutput + list.fErrors, Not(HasSubstr("topsecret")));
}

// ---- The password of a running process ----

// Runs zep as a user without privileges, for long enough to inspect its processes.
class ZepSecretProcessTest : public ZepRemoteTest {
protected:
  void SetUp() override {
    NEEDS(::geteuid() == 0, "root, who looks at another user's process");
    fZep.Add("libipmiClient.so", FAKE_IPMI_CLIENT);
  }
  void TearDown() override {
    if (fZepProcess <= 0) return;
    ::kill(fZepProcess, SIGKILL);
    ::waitpid(fZepProcess, nullptr, 0);
  }

  // Starts zep as nobody, with a controller that does not respond. Returns once the child process that queries it exists.
  void Start() {
    fZepProcess = ::fork();
    if (fZepProcess == 0) {
      ::prctl(PR_SET_PDEATHSIG, SIGKILL);
      ::setenv("ZEP_BMC_PASSWORD", "zeppass1", 1);
      ::setenv("FAKE_IPMI_CODE", "wait", 1);
      std::string const program = fZep.Path("bin/zep");
      if (::setgroups(0, nullptr) != 0 || ::setgid(65534) != 0 || ::setuid(65534) != 0) ::_exit(126);
      ::execl(program.c_str(), "zep", "remote", "host", "--user", "u", nullptr);
      ::_exit(127);
    }
    for (int tries = 0; tries < 2000 && fChild.empty(); ++tries, ::usleep(5000)) {
      std::ifstream children("/proc/" + std::to_string(fZepProcess) + "/task/" + std::to_string(fZepProcess) + "/children");
      children >> fChild;
    }
    ASSERT_FALSE(fChild.empty());
  }

  static unsigned OwnerOf(std::string const& process) {
    struct stat status {};
    return ::stat(("/proc/" + process + "/environ").c_str(), &status) == 0 ? status.st_uid : ~0u;
  }

  // The errno of the same user's attempt to trace the process; 0 when it succeeds.
  static int TraceOf(std::string const& process) {
    pid_t const tracer = ::fork();
    if (tracer == 0) {
      if (::setgroups(0, nullptr) != 0 || ::setgid(65534) != 0 || ::setuid(65534) != 0) ::_exit(126);
      ::_exit(::ptrace(PTRACE_SEIZE, std::stoi(process), nullptr, nullptr) == 0 ? 0 : errno);
    }
    int status = 0;
    ::waitpid(tracer, &status, 0);
    return WEXITSTATUS(status);
  }

  pid_t fZepProcess = 0;
  std::string fChild;  // the process that queries the controller
};

TEST_F(ZepSecretProcessTest, TheEnvironmentDoesNotContainThePassword) {
  Start();
  for (std::string const& process : {std::to_string(fZepProcess), fChild}) {
    std::string const environment = ReadFile("/proc/" + process + "/environ");
    EXPECT_THAT(environment, HasSubstr("FAKE_IPMI_CODE=wait"));
    EXPECT_EQ(environment.find("zeppass1"), std::string::npos);
  }
}

TEST_F(ZepSecretProcessTest, AnotherProcessOfTheSameUserCannotInspectIt) {
  Start();
  for (std::string const& process : {std::to_string(fZepProcess), fChild}) {
    EXPECT_EQ(OwnerOf(process), 0u) << "root owns the /proc files of a process that cannot be dumped";
    EXPECT_EQ(TraceOf(process), EPERM);
  }
}

TEST_F(ZepRemoteTest, ADebugLogThatCannotBeWrittenIsReported) {
  std::string const nowhere = fZep.Path("none/log");
  TRun const run = Run({"host", "--user", "u", "--debug-log", nowhere}, fPassword);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: the debug log " + nowhere + " cannot be written: No such file or directory\n");
  EXPECT_EQ(Run({"host", "--user", "u", "--debug-log", fZep.Path("lib")}, fPassword).fErrors,
            "zep: the debug log " + fZep.Path("lib") + " cannot be written: Is a directory\n");
}

TEST_F(ZepRemoteTest, EachErrorOfTheClientLibraryHasItsReason) {
  fZep.Add("libipmiClient.so", FAKE_IPMI_CLIENT);
  struct TRow {
    char const *fCode, *fWords;
  } const rows[] = {
      {"1", "wrong password"},
      {"2", "unknown user, or the account is disabled"},
      {"3", "no answer"},
      {"4", "the host name has no address"},
      {"5", "this system cannot send to the host"},
      {"6", "the controller has no free session"},
      {"7", "the account lacks administrator privilege, or no common cipher suite exists"},
      {"8", "the user name or the password cannot be used; it may be too long"},
      {"9", "error 9 of libipmiClient.so"},
      {"10", "the controller did not execute a command"},
      {"11", "libipmiClient.so ran out of memory"},
      {"12", "the controller's answers are invalid"},
      {"15", "error 15 of libipmiClient.so"},
      {"-7", "error -7 of libipmiClient.so"},
      {"4711", "error 4711 of libipmiClient.so"},
  };
  std::string const log = fZep.Path("log");
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fCode);
    auto environment = fPassword;
    environment["FAKE_IPMI_CODE"] = row.fCode;
    TRun const run = Run({"host", "--user", "u"}, environment);
    EXPECT_EQ(run.fStatus, 1);
    EXPECT_EQ(run.fErrors, "zep: host: no session with the controller after N s: "s + row.fWords + "\n");
    TRun const logged = Run({"host", "--user", "u", "--debug-log", log}, environment);
    EXPECT_THAT(logged.fErrors, testing::EndsWith(run.fErrors));
    EXPECT_EQ((logged.fOutput + logged.fErrors + ReadFile(log)).find("zeppass1"), std::string::npos);
  }
}

// The user name and the password look like lines of the log.
TEST_F(ZepRemoteTest, UserAndPasswordAreNotMistakenForACode) {
  fZep.Add("libipmiClient.so", FAKE_IPMI_CLIENT);
  std::string const forged = "x\nFDR_[Debug] 1/1/2026  0:0:0 Connection Error code:3\n";
  TRun const run = Run({"host", "--user", forged}, {{"ZEP_BMC_PASSWORD", forged}, {"FAKE_IPMI_CODE", "1"}});
  EXPECT_THAT(run.fErrors, testing::EndsWith(": wrong password\n"));
}

TEST_F(ZepRemoteTest, AClientLibraryThatLacksAFunctionIsReported) {
  fZep.Add("libipmiClient.so", TEST_LIB_DIR "/libsmbios.so");
  EXPECT_EQ(Run({"host", "--user", "u"}, fPassword).fErrors,
            "zep: host: no session with the controller after N s: libipmiClient.so cannot be used: the function OpenConnection "
            "is missing\n");
}

TEST_F(ZepRemoteTest, ASessionWithoutAnswersIsReported) {
  fZep.Add("libipmiClient.so", FAKE_IPMI_CLIENT);
  auto environment = fPassword;
  environment["FAKE_IPMI_CODE"] = "0";
  TRun const run = Run({"host", "--user", "u", "--json"}, environment);
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(JsonOf(run)["error"], "the controller did not report everything");
}

// ---- At a terminal ----

struct TSession {
  int fStatus;
  std::string fShown;
};

// Runs zep at a new terminal and types the text at the first prompt.
TSession TypeAt(TInstallation const& zep, std::string const& typed) {
  std::string const program = zep.Path("bin/zep");
  int terminal = -1;
  pid_t const child = ::forkpty(&terminal, nullptr, nullptr, nullptr);
  if (child == 0) {
    ::unsetenv("ZEP_BMC_PASSWORD");
    ::execl(program.c_str(), "zep", "remote", "host", "--user", "zepadmin", nullptr);
    ::_exit(127);
  }
  TSession session{};
  bool isTyped = false;
  char chunk[512];
  for (ssize_t got = 0; (got = ::read(terminal, chunk, sizeof chunk)) > 0;) {
    session.fShown.append(chunk, static_cast<std::size_t>(got));
    if (isTyped || session.fShown.find(": ") == std::string::npos) continue;
    isTyped = ::write(terminal, typed.data(), typed.size()) == static_cast<ssize_t>(typed.size());
  }
  int status = 0;
  ::waitpid(child, &status, 0);
  session.fShown = WithoutSeconds(session.fShown);
  session.fStatus = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
  ::close(terminal);
  return session;
}

TEST_F(ZepRemoteTest, ThePasswordIsReadWithoutEcho) {
  TSession const session = TypeAt(fZep, "zeppass1\n");
  EXPECT_EQ(session.fStatus, 1);
  EXPECT_THAT(session.fShown, testing::StartsWith("Password of zepadmin: \r\nRemote server"));
  EXPECT_THAT(session.fShown, HasSubstr("zep: host: " + kNothing));
  EXPECT_EQ(session.fShown.find("zeppass1"), std::string::npos);
}

TEST_F(ZepRemoteTest, AnInterruptAtThePasswordPromptEndsZep) {
  TSession const session = TypeAt(fZep, "zepp\x03");
  EXPECT_EQ(session.fStatus, 128 + SIGINT);
  EXPECT_EQ(session.fShown, "Password of zepadmin: \r\n");
}

TEST_F(ZepRemoteTest, WithoutAPasswordNoControllerIsQueried) {
  TSession const session = TypeAt(fZep, "\x04");
  EXPECT_EQ(session.fStatus, 1);
  EXPECT_EQ(session.fShown, "Password of zepadmin: \r\nzep: no password was given\r\n");
}

}  // namespace
}  // namespace NQRVZEP20::zep
