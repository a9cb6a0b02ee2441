// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include <sys/select.h>
#include <termios.h>
#include <unistd.h>

#include <cstdio>

namespace NQRVZEP20 {
namespace {

// Makes each key available as soon as it is typed: all local modes of the terminal on standard input are off, and a read returns
// after one key. The destructor restores the settings. Standard input that is not a terminal is not changed.
class TSingleKeys {
public:
  TSingleKeys() : fIsTerminal(::tcgetattr(STDIN_FILENO, &fSettings) == 0) {
    if (!fIsTerminal) return;
    termios settings = fSettings;
    settings.c_lflag = 0;
    settings.c_cc[VMIN] = 1;
    settings.c_cc[VTIME] = 0;
    ::tcsetattr(STDIN_FILENO, TCSANOW, &settings);
  }
  ~TSingleKeys() {
    if (fIsTerminal) ::tcsetattr(STDIN_FILENO, TCSANOW, &fSettings);
  }
  TSingleKeys(TSingleKeys const&) = delete;
  TSingleKeys& operator=(TSingleKeys const&) = delete;

private:
  termios fSettings;
  bool fIsTerminal;
};

}  // namespace

bool TOSSpecific::IsKeyWaiting() {
  TSingleKeys const singleKeys;
  fd_set readable;
  FD_ZERO(&readable);
  FD_SET(STDIN_FILENO, &readable);
  timeval noTime{0, 0};
  return ::select(STDIN_FILENO + 1, &readable, nullptr, nullptr, &noTime) != 0;  // also true when select fails. Kept.
}

int TOSSpecific::GetKeyboardChar() {
  TSingleKeys const singleKeys;
  // Not through stdio, which would buffer more than one character, where IsKeyWaiting cannot see it.
  unsigned char character;
  return ::read(STDIN_FILENO, &character, 1) == 1 ? character : EOF;
}

}  // namespace NQRVZEP20
