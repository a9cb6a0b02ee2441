// SPDX-License-Identifier: Apache-2.0

// The keyboard on a real pseudo terminal, the sleep, who and where we are, and the two flags.

#include "TOSSpecific.h"
#include "core/Handles.h"
#include "tests/os/HostTools.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/stat.h>
#include <termios.h>

#include <atomic>
#include <chrono>
#include <cstring>

namespace NQRVZEP20 {
namespace {

using namespace std::chrono_literals;
using TClock = std::chrono::steady_clock;

// Puts a descriptor in the place of standard input, and the old one back at the end.
class TStandardInput {
public:
  explicit TStandardInput(int fd) : fOld(::dup(0)) { ::dup2(fd, 0); }
  ~TStandardInput() { ::dup2(fOld.get(), 0); }
  TStandardInput(TStandardInput const&) = delete;
  TStandardInput& operator=(TStandardInput const&) = delete;

private:
  TUniqueFd fOld;
};

// A pseudo terminal as standard input, with somebody at its keyboard.
class KeyboardTest : public testing::Test {
protected:
  KeyboardTest() : fKeyboard(::posix_openpt(O_RDWR | O_NOCTTY)) {
    ::grantpt(fKeyboard.get());
    ::unlockpt(fKeyboard.get());
    fTerminal = TUniqueFd(::open(::ptsname(fKeyboard.get()), O_RDWR | O_NOCTTY));
    fInput = std::make_unique<TStandardInput>(fTerminal.get());
  }

  void Type(std::string const& keys) {
    ASSERT_EQ(::write(fKeyboard.get(), keys.data(), keys.size()), static_cast<ssize_t>(keys.size()));
  }

  termios Settings() const {
    termios settings{};
    EXPECT_EQ(::tcgetattr(fTerminal.get(), &settings), 0);
    return settings;
  }

  // What the terminal shows within that time and the moment after, its echo above all.
  std::string Shown(int milliseconds = 100) const {
    std::string shown;
    for (pollfd keyboard{fKeyboard.get(), POLLIN, 0}; ::poll(&keyboard, 1, milliseconds) > 0; milliseconds = 100) {
      char chunk[256];
      ssize_t const got = ::read(fKeyboard.get(), chunk, sizeof chunk);
      if (got <= 0) break;
      shown.append(chunk, static_cast<std::size_t>(got));
    }
    return shown;
  }

  // Waits until somebody has switched the terminal to single keys.
  void WaitForSingleKeys() const {
    while ((Settings().c_lflag & ICANON) != 0) std::this_thread::sleep_for(1ms);
  }

  TUniqueFd fKeyboard, fTerminal;
  std::unique_ptr<TStandardInput> fInput;
};

bool operator==(termios const& left, termios const& right) {
  return left.c_iflag == right.c_iflag && left.c_oflag == right.c_oflag && left.c_cflag == right.c_cflag &&
         left.c_lflag == right.c_lflag && std::memcmp(left.c_cc, right.c_cc, sizeof left.c_cc) == 0;
}

TEST_F(KeyboardTest, AKeyWaitsOnceItIsTyped) {
  EXPECT_FALSE(TOSSpecific::IsKeyWaiting());
  Type("a");
  EXPECT_TRUE(TOSSpecific::IsKeyWaiting());
  EXPECT_TRUE(TOSSpecific::IsKeyWaiting());  // asking does not take it
  EXPECT_EQ(TOSSpecific::GetKeyboardChar(), 'a');
  EXPECT_FALSE(TOSSpecific::IsKeyWaiting());
}

TEST_F(KeyboardTest, EveryKeyTypedAheadIsHandedOnByItself) {
  Type("abc");
  for (int const key : {'a', 'b', 'c'}) {
    EXPECT_TRUE(TOSSpecific::IsKeyWaiting());
    EXPECT_EQ(TOSSpecific::GetKeyboardChar(), key);
  }
  EXPECT_FALSE(TOSSpecific::IsKeyWaiting());
}

TEST_F(KeyboardTest, AskingForAKeyNeverBlocks) {
  auto const start = TClock::now();
  for (int i = 0; i < 100; ++i) EXPECT_FALSE(TOSSpecific::IsKeyWaiting());
  EXPECT_LT(TClock::now() - start, 5s);
}

TEST_F(KeyboardTest, ACharacterIsWaitedForWithoutEchoAndWithoutEnter) {
  std::atomic<int> character{-2};
  std::thread reader([&] { character = TOSSpecific::GetKeyboardChar(); });
  WaitForSingleKeys();
  EXPECT_EQ(Settings().c_lflag, 0u);  // all local modes are off
  std::this_thread::sleep_for(200ms);
  EXPECT_EQ(character, -2);
  Type("x");
  reader.join();
  EXPECT_EQ(character, 'x');
  EXPECT_EQ(Shown(), "");
}

TEST_F(KeyboardTest, EveryKeyIsACharacterSoAreThoseOfSignalsAndOfTheEnd) {
  for (int const key : {3, 4, 26, 27, 28, 127, 0, 255, 200}) {  // ^C, ^D, ^Z, escape, ^\, delete, ...
    SCOPED_TRACE(key);
    std::atomic<int> character{-2};
    std::thread reader([&] { character = TOSSpecific::GetKeyboardChar(); });
    WaitForSingleKeys();
    Type(std::string(1, static_cast<char>(key)));
    reader.join();
    EXPECT_EQ(character, key);
  }
}

TEST_F(KeyboardTest, ACharacterIsWaitedForWhateverTheTerminalsMinimumIs) {
  for (cc_t const minimum : {0, 5}) {
    termios settings = Settings();
    settings.c_cc[VMIN] = minimum;
    ::tcsetattr(fTerminal.get(), TCSANOW, &settings);
    std::atomic<int> character{-2};
    std::thread reader([&] { character = TOSSpecific::GetKeyboardChar(); });
    WaitForSingleKeys();
    std::this_thread::sleep_for(50ms);
    EXPECT_EQ(character, -2);
    Type("x");
    reader.join();
    EXPECT_EQ(character, 'x');
    EXPECT_EQ(Settings().c_cc[VMIN], minimum);
    while (TOSSpecific::IsKeyWaiting()) TOSSpecific::GetKeyboardChar();
  }
}

TEST_F(KeyboardTest, SettingsComeBackAsTheyWere) {
  termios settings = Settings();
  settings.c_lflag = ISIG | ICANON | ECHOK | NOFLSH;
  settings.c_iflag = IXON | BRKINT;
  settings.c_cc[VINTR] = 7;
  settings.c_cc[VTIME] = 3;
  ASSERT_EQ(::tcsetattr(fTerminal.get(), TCSANOW, &settings), 0);
  settings = Settings();
  TOSSpecific::IsKeyWaiting();
  EXPECT_TRUE(Settings() == settings);
  Type("x");
  TOSSpecific::IsKeyWaiting();
  EXPECT_TRUE(Settings() == settings);
  TOSSpecific::GetKeyboardChar();
  EXPECT_TRUE(Settings() == settings);
}

TEST_F(KeyboardTest, AfterwardsTheTerminalHandsOnLinesAgain) {
  TOSSpecific::IsKeyWaiting();
  Type("line\n");
  EXPECT_EQ(Shown(5000), "line\r\n");  // echoed
  char line[16];
  ASSERT_EQ(::read(0, line, sizeof line), 5);
  EXPECT_EQ(std::string(line, 5), "line\n");
}

TEST_F(KeyboardTest, AHangUpIsTheEnd) {
  fKeyboard.reset();
  EXPECT_TRUE(TOSSpecific::IsKeyWaiting());
  EXPECT_EQ(TOSSpecific::GetKeyboardChar(), EOF);
}

// ---- Standard input that is no terminal ----

TEST(NoKeyboardTest, APipeWorksAsWell) {
  int ends[2];
  ASSERT_EQ(::pipe(ends), 0);
  TUniqueFd readEnd(ends[0]), writeEnd(ends[1]);
  TStandardInput const input(readEnd.get());
  EXPECT_FALSE(TOSSpecific::IsKeyWaiting());
  ASSERT_EQ(::write(writeEnd.get(), "a\xff", 2), 2);
  EXPECT_TRUE(TOSSpecific::IsKeyWaiting());
  EXPECT_EQ(TOSSpecific::GetKeyboardChar(), 'a');
  EXPECT_TRUE(TOSSpecific::IsKeyWaiting());
  EXPECT_EQ(TOSSpecific::GetKeyboardChar(), 255);
  EXPECT_FALSE(TOSSpecific::IsKeyWaiting());
  writeEnd.reset();
  EXPECT_TRUE(TOSSpecific::IsKeyWaiting());  // the end can be read
  EXPECT_EQ(TOSSpecific::GetKeyboardChar(), EOF);
}

TEST(NoKeyboardTest, TheNullDeviceIsAtItsEnd) {
  TUniqueFd const null(::open("/dev/null", O_RDONLY));
  TStandardInput const input(null.get());
  EXPECT_TRUE(TOSSpecific::IsKeyWaiting());
  EXPECT_EQ(TOSSpecific::GetKeyboardChar(), EOF);
}

TEST(NoKeyboardTest, AKeyWaitsAlsoWhereSelectFails) {
  EXPECT_EQ(InChild([] {
              ::close(0);
              return std::string(TOSSpecific::IsKeyWaiting() ? "waiting" : "not waiting") +
                     (TOSSpecific::GetKeyboardChar() == EOF ? ", end" : ", character");
            }),
            "waiting, end");
}

// ---- USleep ----

TEST(USleepTest, SleepsMilliseconds) {
  auto const start = TClock::now();
  EXPECT_EQ(TOSSpecific::USleep(250), 0);
  auto const slept = TClock::now() - start;
  EXPECT_GE(slept, 250ms);
  EXPECT_LT(slept, 10s);
  EXPECT_EQ(TOSSpecific::USleep(0), 0);
}

TEST(USleepTest, ASignalEndsItEarly) {
  struct sigaction action {
  }, old;
  action.sa_handler = [](int) {};
  ::sigaction(SIGUSR1, &action, &old);
  // The last of these in microseconds is more than 32 bits hold.
  for (unsigned int const milliseconds : {60000u, 4294968u}) {
    std::atomic<bool> done{false};
    auto const start = TClock::now();
    std::thread interrupter([&done, sleeper = ::pthread_self()] {
      std::this_thread::sleep_for(200ms);
      while (!done) {
        ::pthread_kill(sleeper, SIGUSR1);
        std::this_thread::sleep_for(20ms);
      }
    });
    EXPECT_EQ(TOSSpecific::USleep(milliseconds), -1);
    EXPECT_GE(TClock::now() - start, 150ms);
    done = true;
    interrupter.join();
  }
  ::sigaction(SIGUSR1, &old, nullptr);
}

// ---- Who and where ----

TEST(IsAdminTest, AsksForTheRealUser) {
  EXPECT_EQ(TOSSpecific::IsAdmin(), ::getuid() == 0);
  EXPECT_EQ(InChild([] { return !BecomeUnprivileged()    ? "still root"
                                : TOSSpecific::IsAdmin() ? "admin"
                                                         : "no admin"; }),
            "no admin");
  NEEDS(::getuid() == 0, "root");
  EXPECT_EQ(InChild([] { return ::seteuid(65534) != 0    ? "still root"
                                : TOSSpecific::IsAdmin() ? "admin"
                                                         : "no admin"; }),
            "admin");
}

// The result in a child where the file in /proc holds that text, or does not exist.
std::string RunningTypeWith(std::function<void()> const& prepare) {
  return InChild([&] {
    if (!MountTmpfs("/proc", "")) return std::string("not mounted");
    prepare();
    return std::to_string(TOSSpecific::GetRunningTypeOnXen());
  });
}

void MakeCapabilities(std::string const& text) {
  std::filesystem::create_directory("/proc/xen");
  WriteFile("/proc/xen/capabilities", text);
}

TEST(GetRunningTypeOnXenTest, TellsHostsAndDomainsApart) {
  NEEDS(MayMount(), "leave to mount a file system");
  EXPECT_EQ(RunningTypeWith([] {}), "2");
  EXPECT_EQ(RunningTypeWith([] { std::filesystem::create_directories("/proc/xen/capabilities"); }), "2");
  EXPECT_EQ(RunningTypeWith([] { MakeCapabilities("control_d\n"); }), "0");
  EXPECT_EQ(RunningTypeWith([] { MakeCapabilities("other, control_domain"); }), "0");
  EXPECT_EQ(RunningTypeWith([] { MakeCapabilities(""); }), "1");
  EXPECT_EQ(RunningTypeWith([] { MakeCapabilities("control\n"); }), "1");
  EXPECT_EQ(RunningTypeWith([] {
              MakeCapabilities("control_d\n");
              std::filesystem::permissions("/proc/xen/capabilities", std::filesystem::perms::none);
              BecomeUnprivileged();
            }),
            "threw kZEPStatusFileNotFound");
}

TEST(GetRunningTypeOnXenTest, ReadsNothingWhereThereIsNoXen) {
  if (std::filesystem::exists("/proc/xen/capabilities")) GTEST_SKIP() << "this machine is a guest of Xen";
  EXPECT_EQ(LogOf([] { EXPECT_EQ(TOSSpecific::GetRunningTypeOnXen(), 2); }), std::vector<std::string>{});
}

// ---- The shell, the command line and the flags ----

TEST(LaunchCommandShellTest, RunsTheShellAndReturnsItsStatus) {
  TTempDir const dir;
  WriteFile(dir.Path("input"), "echo typed > " + dir.Path("output") + "\nexit 3\n");
  TUniqueFd const file(::open(dir.Path("input").c_str(), O_RDONLY));
  TStandardInput const input(file.get());
  int const status = TOSSpecific::LaunchCommandShell();
  EXPECT_TRUE(WIFEXITED(status));
  EXPECT_EQ(WEXITSTATUS(status), 3);
  EXPECT_EQ(ReadFile(dir.Path("output")), "typed\n");
}

TEST(ExpandCommandLineWildcardsTest, HandsBothOnUnchanged) {
  char program[] = "program", pattern[] = "*.h";
  char* arguments[] = {program, pattern, nullptr};
  int count = 0;
  char** expanded = nullptr;
  TOSSpecific::ExpandCommandLineWildcards(2, arguments, &count, &expanded);
  EXPECT_EQ(count, 2);
  EXPECT_EQ(expanded, arguments);
  EXPECT_STREQ(expanded[1], "*.h");
  TOSSpecific::ExpandCommandLineWildcards(0, nullptr, &count, &expanded);
  EXPECT_EQ(count, 0);
  EXPECT_EQ(expanded, nullptr);
}

TEST(FlagsTest, AreFalseAtTheStartAndEachForItself) {
  EXPECT_FALSE(TOSSpecific::getLuz());
  EXPECT_FALSE(TOSSpecific::isZEPParser());
  TOSSpecific::setLuz(true);
  EXPECT_TRUE(TOSSpecific::getLuz());
  EXPECT_TRUE(isLuz);
  EXPECT_FALSE(TOSSpecific::isZEPParser());
  TOSSpecific::setLuz(false);
  TOSSpecific::setZEPParser(true);
  EXPECT_FALSE(TOSSpecific::getLuz());
  EXPECT_TRUE(TOSSpecific::isZEPParser());
  EXPECT_TRUE(isParser);
  isParser = false;
  EXPECT_FALSE(TOSSpecific::isZEPParser());
}

}  // namespace
}  // namespace NQRVZEP20
