// SPDX-License-Identifier: Apache-2.0

// Tests zep wpad as users run it, with real DHCP servers.

#include "tests/system/wpad/WpadBed.h"
#include "tests/tools/zep/Envelope.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <regex>

namespace NQRVZEP20 {
namespace {

std::string const kTable = "Interface         Address           Sent            Reply\n";
std::string const kWillEnd =
    "This stops the DHCP clients of this machine: every process with \"dhclient\" in its line of \"ps -e\".\n";

class ZepWpadTest : public TWpadBed {
protected:
  // Measured times become "N ms".
  TRun Zep(std::string const& settings, std::string const& command) {
    TRun run = RunInside(settings, command);
    run.fOutput = std::regex_replace(run.fOutput, std::regex("[0-9]+ ms"), "N ms");
    return run;
  }

  nlohmann::json Json(std::string const& settings, std::string const& command) {
    return nlohmann::json::parse(RunInside(settings, command).fOutput);
  }
};

// zep waits for an eighth of the time.
std::string const kInHurry = "LD_PRELOAD=$HURRY ";

TEST_F(ZepWpadTest, PrintsTheUrlTheMessagesAndTheReplies) {
  TRun const run = Zep("", "$ZEP wpad --yes");
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput, "http://wpad.test/wpad.dat\n\n" + kTable +
                             "eth0              10.77.0.2         1 x 1472 bytes  300 bytes from 10.77.0.1\n"
                             "                                                    after N ms, with the URL\n");
  EXPECT_EQ(run.fErrors, kWillEnd + "  (none is running)\n");
}

TEST_F(ZepWpadTest, PrintsJson) {
  nlohmann::json const document = Json("", "$ZEP wpad --yes --json");
  zep::ExpectEnvelope(document, 0, "zep wpad");
  EXPECT_EQ(document["status"], "complete");
  EXPECT_EQ(document["url"], "http://wpad.test/wpad.dat");
  EXPECT_EQ(document["stoppedClients"], true);
  EXPECT_EQ(document["messageBytes"], 1472);
  EXPECT_EQ(document["failure"], nullptr);
  EXPECT_FALSE(document.contains("file"));
  ASSERT_EQ(document["interfaces"].size(), 1u);
  nlohmann::json const& query = document["interfaces"][0];
  EXPECT_EQ(query["interface"], "eth0");
  EXPECT_EQ(query["up"], true);
  EXPECT_EQ(query["promiscuous"], false);
  EXPECT_EQ(query["address"], "10.77.0.2");
  EXPECT_EQ(query["hardwareAddress"].get<std::string>().size(), 17u);
  EXPECT_EQ(query["sent"], 1);
  EXPECT_EQ(query["reply"]["bytes"], 300);
  EXPECT_EQ(query["reply"]["from"], "10.77.0.1");
  EXPECT_LT(query["reply"]["milliseconds"], 5000);
  EXPECT_EQ(query["reply"]["url"], "http://wpad.test/wpad.dat");
  EXPECT_EQ(query["failure"], nullptr);
}

// ---- DHCP clients ----

std::string const kOnceItRuns = "until ps -e | grep -q dhclient; do sleep 0.02; done; ";
std::string const kIsItThere = "; sleep 0.3; ps -e -o comm= | grep -c dhclient; true";

TEST_F(ZepWpadTest, ListsTheDhcpClientsAndAsksForConfirmation) {
  struct {
    char const* fWhat;
    std::string fCommand;
    bool fIsEnded;
  } const rows[] = {
      {"yes", "echo y | $ZEP wpad", true}, {"yes in full", "echo yes | $ZEP wpad", true},
      {"no", "echo n | $ZEP wpad", false}, {"something else", "echo yonder | $ZEP wpad", false},
      {"no answer", "$ZEP wpad", false},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fWhat);
    TRun const run = Zep("WPAD_DHCLIENT=1", kOnceItRuns + row.fCommand + kIsItThere);
    EXPECT_EQ(LinesOf(run.fOutput).back(), row.fIsEnded ? "0" : "1");
    TLines const errors = LinesOf(run.fErrors);
    ASSERT_GE(errors.size(), 3u);
    EXPECT_EQ(errors[0] + "\n", kWillEnd);
    EXPECT_NE(errors[1].find(" dhclient"), std::string::npos) << errors[1];
    std::string const asked = "Continue? [y/N] ";
    EXPECT_EQ(errors[2].substr(0, asked.size()), asked);
    std::string const refused = "zep: nothing was done; --yes confirms, and --no-stop keeps the DHCP clients running";
    EXPECT_EQ(errors[2].substr(asked.size()) == refused, !row.fIsEnded) << errors[2];
  }
}

TEST_F(ZepWpadTest, WithoutConfirmationNothingIsDone) { EXPECT_EQ(Zep("", "echo n | $ZEP wpad").fStatus, 1); }

TEST_F(ZepWpadTest, OptionYesConfirms) {
  TRun const run = Zep("WPAD_DHCLIENT=1", kOnceItRuns + "$ZEP wpad --yes" + kIsItThere);
  EXPECT_EQ(LinesOf(run.fOutput).back(), "0");
  EXPECT_EQ(run.fErrors.find("Continue?"), std::string::npos) << run.fErrors;
}

// BusyBox prints a name with a line break as two lines.
std::string const kForgedLine =
    "mkdir $TMPDIR/bin && ln -s $(command -v busybox) $TMPDIR/bin/ps && export PATH=$TMPDIR/bin:$PATH; "
    "sleep 100 & victim=$!; "
    "python3 -c 'import ctypes, sys, time; ctypes.CDLL(None).prctl(15, b\"\\n%d dhclient\" % int(sys.argv[1])); time.sleep(100)' "
    "$victim & until ps -e | grep -q \"^ *$victim dhclient\"; do sleep 0.02; done; ";
std::string const kDoesItLive = "; echo $?; kill -0 $victim && echo lives";

TEST_F(ZepWpadTest, LineOfAnotherProcessIsRefused) {
  std::string const settings = "TMPDIR=" + fDir.Path() + " ";
  for (std::string const command : {"$ZEP wpad --yes", "echo y | $ZEP wpad"}) {
    std::filesystem::remove_all(fDir.Path("bin"));
    TRun const run = Zep(settings, kForgedLine + command + kDoesItLive);
    EXPECT_EQ(run.fOutput, "1\nlives\n");
    EXPECT_NE(std::regex_search(
                  run.fErrors, std::regex("zep: the line \" *[0-9]+ dhclient.*\" of \"ps -e\" is wrong: process [0-9]+ "
                                          "is \"sleep\"\\. Nothing was killed\\. Another process may have forged the line .* "
                                          "/proc/PID/comm and kill that process\\. --no-stop leaves the DHCP clients running\n")),
              false)
        << run.fErrors;
  }
}

// Numbers that "kill" accepts and /proc does not, in lines that differ each time.
TEST_F(ZepWpadTest, NumberWithLeadingZerosIsRefused) {
  std::string const forging =
      "mkdir $TMPDIR/bin && export PATH=$TMPDIR/bin:$PATH; sleep 100 & victim=$!; "
      "printf '#!/bin/sh\necho \"0%s $(cat /proc/uptime) dhclient\"\nsleep 0.05\n' $victim > $TMPDIR/bin/ps; "
      "chmod +x $TMPDIR/bin/ps; ";
  TRun const run = Zep("TMPDIR=" + fDir.Path() + " ", forging + "$ZEP wpad --yes" + kDoesItLive);
  EXPECT_EQ(run.fOutput, "1\nlives\n");
  EXPECT_TRUE(std::regex_search(run.fErrors, std::regex("is wrong: 0[0-9]+ is not a process ID\\. Nothing was killed\\.")))
      << run.fErrors;
}

TEST_F(ZepWpadTest, OptionNoStopLeavesTheDhcpClientsRunning) {
  TRun const run = Zep("WPAD_DHCLIENT=1", kOnceItRuns + "$ZEP wpad --no-stop" + kIsItThere);
  EXPECT_EQ(LinesOf(run.fOutput).front(), "http://wpad.test/wpad.dat");
  EXPECT_EQ(LinesOf(run.fOutput).back(), "1");
  EXPECT_EQ(run.fErrors, "");
  EXPECT_EQ(Json("", "$ZEP wpad --no-stop --json")["stoppedClients"], false);
}

// ---- Nothing found ----

TEST_F(ZepWpadTest, NoAnswer) {
  TRun const run = Zep("WPAD_SERVER=none", kInHurry + "$ZEP wpad --no-stop");
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, kTable + "eth0              10.77.0.2         3 x 1472 bytes  none within 18 s\n");
  EXPECT_EQ(run.fErrors, "zep: no server returned a proxy configuration URL\n");
}

TEST_F(ZepWpadTest, AnAnswerWithoutAUrl) {
  TRun const run = Zep("WPAD_URL=-", "$ZEP wpad --no-stop --fetch");
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, kTable +
                             "eth0              10.77.0.2         1 x 1472 bytes  300 bytes from 10.77.0.1\n"
                             "                                                    after N ms, without a URL\n");
  nlohmann::json const document = Json("WPAD_URL=-", "$ZEP wpad --no-stop --fetch --json");
  zep::ExpectEnvelope(document, 1, "zep wpad");
  EXPECT_EQ(document["status"], "nothing");
  EXPECT_EQ(document["url"], nullptr);
  EXPECT_EQ(document["interfaces"][0]["reply"]["url"], nullptr);
  EXPECT_FALSE(document.contains("file"));
}

TEST_F(ZepWpadTest, PrintsTheResultForEachInterface) {
  struct {
    char const* fSettings;
    char const* fBefore;
    std::string fRows;
    char const* fErrors;
  } const rows[] = {
      {"WPAD_FIRST=up WPAD_NAME=eth1", "",
       "eth0              10.99.0.2         3 x 1472 bytes  none within 18 s\n"
       "eth1              10.77.0.2         1 x 1472 bytes  300 bytes from 10.77.0.1\n"
       "                                                    after N ms, with the URL\n",
       ""},
      {"WPAD_FIRST=down WPAD_NAME=eth1", "ip addr flush dev eth0; ip link set eth1 promisc on; ",
       "eth0, down                          nothing         it has no IPv4 address\n"
       "eth1,             10.77.0.2         1 x 1472 bytes  300 bytes from 10.77.0.1\n"
       "promiscuous                                         after N ms, with the URL\n",
       ""},
      {"WPAD_ROUTE=none", "",
       "eth0              10.77.0.2         nothing         sending failed: Network is\n"
       "                                                    unreachable\n",
       "zep: no server returned a proxy configuration URL\n"},
      {"WPAD_FIRST=up WPAD_NAME=net1",
       "mkdir /dev/shm/bin; printf '#!/bin/sh\\necho inet6 addr: fd77::2/64' > /dev/shm/bin/ifconfig; "
       "chmod +x /dev/shm/bin/ifconfig; export PATH=/dev/shm/bin:$PATH; ",
       "eth0              10.99.0.2         3 x 1472 bytes  none within 18 s\n"
       "IPv6              fd77::2           1 x 1472 bytes  300 bytes from 10.77.0.1\n"
       "                                                    after N ms, with the URL\n",
       ""},
      {"WPAD_NAME=net0", "", "", "zep: no interface has a name that begins with \"eth\"\n"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fSettings);
    TRun const run = Zep(row.fSettings, row.fBefore + kInHurry + "$ZEP wpad --no-stop");
    bool const isFound = *row.fErrors == '\0';
    EXPECT_EQ(run.fStatus, isFound ? 0 : 1);
    EXPECT_EQ(run.fOutput, (isFound ? "http://wpad.test/wpad.dat\n\n" : "") + (row.fRows.empty() ? "" : kTable + row.fRows));
    EXPECT_EQ(run.fErrors, row.fErrors);
  }
}

TEST_F(ZepWpadTest, PortThatStaysInUseEndsTheSearch) {
  TRun const run = Zep("WPAD_FIRST=up WPAD_NAME=eth1", R"sh(
    python3 -c 'import socket, time; s = socket.socket(socket.AF_INET, socket.SOCK_DGRAM); s.bind(("", 68)); time.sleep(60)' &
    for _ in $(seq 100); do [ -n "$(ss -Hlnu 'sport = :68')" ] && break; sleep 0.05; done
    LD_PRELOAD=$HURRY $ZEP wpad --no-stop)sh");
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, kTable +
                             "eth0              10.99.0.2         nothing         another program is using\n"
                             "                                                    port 68\n");
  EXPECT_EQ(run.fErrors,
            "zep: another program is using port 68; trying again for up to 30 s\nzep: another program is using port 68\n");
}

TEST_F(ZepWpadTest, OnlyRootMayListen) {
  TRun const run = Zep("WPAD_DHCLIENT=1", R"sh(
    mkdir -p /dev/shm/zep/bin /dev/shm/zep/lib; cp $ZEP /dev/shm/zep/bin; cp $(dirname $ZEP)/../lib/libzepcore.so /dev/shm/zep/lib
    setpriv --reuid=65534 --regid=65534 --clear-groups /dev/shm/zep/bin/zep wpad --yes)sh");
  EXPECT_EQ(run.fStatus, 1);
  EXPECT_EQ(run.fOutput, "");
  EXPECT_EQ(run.fErrors, "zep: zep wpad must be run as root: only root may listen on port 68\n");
}

TEST_F(ZepWpadTest, TerminalShowsACountdown) {
  TRun const run = Zep("WPAD_SERVER=none", kInHurry + "script -qec '$ZEP wpad --no-stop' /dev/null < /dev/null");
  for (int left = 18; left > 0; --left)
    EXPECT_NE(run.fOutput.find("\rWaiting for a reply to 10.77.0.2: " + std::to_string(left) + " s left"), std::string::npos)
        << left << " in " << run.fOutput;
  std::string const wiped = '\r' + std::string(std::string("Waiting for a reply to 10.77.0.2: 18 s left").size(), ' ') + '\r';
  EXPECT_NE(run.fOutput.find(wiped + "Interface"), std::string::npos) << run.fOutput;
}

// ---- The file ----

std::string const kFile = "function FindProxyForURL(url, host) { return \"PROXY 10.77.0.1:3128\"; }\n";

bool IsCurlThere() { return std::system("PATH=$PATH:/usr/sbin:/sbin ldconfig -p | grep -q 'libcurl\\.so\\.4 '") == 0; }

TEST_F(ZepWpadTest, FetchesTheFile) {
  NEEDS(IsCurlThere(), "no libcurl (package libcurl4)");
  TRun const run = Zep("", "http_proxy=http://127.0.0.1:1 $ZEP wpad --no-stop --fetch");
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_EQ(run.fOutput.substr(run.fOutput.size() - kFile.size() - 1), "\n" + kFile);
  EXPECT_EQ(run.fErrors, "");
  nlohmann::json const document = Json("", "$ZEP wpad --no-stop --fetch --json");
  EXPECT_EQ(document["status"], "complete");
  EXPECT_EQ(document["file"], (nlohmann::json{{"text", kFile}, {"failure", nullptr}}));
}

TEST_F(ZepWpadTest, PrintsWhyTheFileWasNotFetched) {
  NEEDS(IsCurlThere(), "no libcurl (package libcurl4)");
  struct {
    char const* fSettings;
    char const* fBefore;
    char const* fFailure;
  } const rows[] = {
      {"WPAD_URL=http://wpad.test/missing", "", "The requested URL returned error: 404"},
      {"WPAD_URL=http://nowhere.test/wpad.dat", "", "Could not resolve host: nowhere.test"},
      {"WPAD_URL=file:///etc/hostname", "", "only plain HTTP (http://) is supported"},
      {"WPAD_URL=https://wpad.test/wpad.dat", "", "only plain HTTP (http://) is supported"},
      {"", "mount --bind /dev/null \"$(readlink -f \"$(ldconfig -p | awk '/libcurl\\.so\\.4 /{print $NF; exit}')\")\"; ",
       "libcurl cannot be loaded: libcurl.so.2: cannot open shared object file: No such file or directory; install the package "
       "libcurl4"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fFailure);
    TRun const run = RunInside(row.fSettings, std::string(row.fBefore) + "$ZEP wpad --no-stop --fetch --json");
    EXPECT_EQ(run.fStatus, 2);
    EXPECT_EQ(run.fErrors, std::string("zep: the file was not fetched: ") + row.fFailure + "\n");
    auto const document = nlohmann::json::parse(run.fOutput);
    zep::ExpectEnvelope(document, 2, "zep wpad");
    EXPECT_EQ(document["status"], "partial");
    EXPECT_EQ(document["file"], (nlohmann::json{{"text", nullptr}, {"failure", row.fFailure}}));
  }
}

TEST_F(ZepWpadTest, FileSizeIsLimited) {
  NEEDS(IsCurlThere(), "no libcurl (package libcurl4)");
  TRun const refused = RunInside("", "$ZEP wpad --no-stop --fetch --max-file 20");
  EXPECT_EQ(refused.fStatus, 2);
  EXPECT_EQ(refused.fErrors, "zep: the file was not fetched: it is larger than 20 bytes; --max-file allows more\n");
  for (char const* size : {"1K", "0"}) {
    TRun const fetched = RunInside("", "$ZEP wpad --no-stop --fetch --max-file " + std::string(size));
    EXPECT_EQ(fetched.fStatus, 0) << fetched.fErrors;
    EXPECT_NE(fetched.fOutput.find(kFile), std::string::npos);
  }
}

TEST_F(ZepWpadTest, UrlIsPrintedWithEscapesAndWithoutItsEnd) {
  // "http://a<escape>[2J", a newline and a zero byte
  std::string const reply = ReplyFile(std::string(2 * 240, '0') + "fc0e" + "687474703a2f2f611b5b324a0a00");
  EXPECT_EQ(LinesOf(Zep(reply, "$ZEP wpad --no-stop").fOutput).front(), "http://a\\x1b[2J");
  EXPECT_EQ(Json(reply, "$ZEP wpad --no-stop --json")["url"], "http://a\x1b[2J");
}

// ---- Usage ----

TEST_F(ZepWpadTest, WrongUsage) {
  for (char const* arguments : {"--yes --no-stop", "--unknown", "eth0"}) {
    SCOPED_TRACE(arguments);
    EXPECT_EQ(Zep("", std::string("$ZEP wpad ") + arguments).fStatus, 64);
  }
}

TEST_F(ZepWpadTest, HelpDescribesTheDhcpClientsAndTheExitStatus) {
  TRun const run = Zep("", "$ZEP wpad --help");
  EXPECT_EQ(run.fStatus, 0);
  EXPECT_NE(run.fOutput.find("the running DHCP clients are stopped first"), std::string::npos);
  EXPECT_NE(run.fOutput.find("Exit status: 0 when a URL was found"), std::string::npos);
}

}  // namespace
}  // namespace NQRVZEP20
