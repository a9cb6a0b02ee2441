// SPDX-License-Identifier: Apache-2.0

// The keyboard, on a real pseudo terminal.

#include "TOSSpecific.h"
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

  // The text that the terminal shows within that time and shortly after, above all its echo.
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
  EXPECT_TRUE(TOSSpecific::IsKeyWaiting());  // the query does not consume the key
  EXPECT_EQ(TOSSpecific::GetKeyboardChar(), 'a');
  EXPECT_FALSE(TOSSpecific::IsKeyWaiting());
}

TEST_F(KeyboardTest, KeysTypedAheadAreReturnedOneByOne) {
  Type("abc");
  for (int const key : {'a', 'b', 'c'}) {
    EXPECT_TRUE(TOSSpecific::IsKeyWaiting());
    EXPECT_EQ(TOSSpecific::GetKeyboardChar(), key);
  }
  EXPECT_FALSE(TOSSpecific::IsKeyWaiting());
}

TEST_F(KeyboardTest, CheckingForAKeyNeverBlocks) {
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

TEST_F(KeyboardTest, ACharacterIsAwaitedWithAnyMinimumOfTheTerminal) {
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

TEST_F(KeyboardTest, SettingsAreRestored) {
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

TEST_F(KeyboardTest, AfterwardsTheTerminalReturnsLinesAgain) {
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

// ---- Standard input that is not a terminal ----

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

TEST(NoKeyboardTest, AKeyWaitsWhenSelectFails) {
  EXPECT_EQ(InChild([] {
              ::close(0);
              return std::string(TOSSpecific::IsKeyWaiting() ? "waiting" : "not waiting") +
                     (TOSSpecific::GetKeyboardChar() == EOF ? ", end" : ", character");
            }),
            "waiting, end");
}

}  // namespace
}  // namespace NQRVZEP20
