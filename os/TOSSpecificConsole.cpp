// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "os/LocalTime.h"

#include <sys/select.h>
#include <termios.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>

namespace NQRVZEP20 {

bool isLuz = false;
bool isParser = false;

namespace {

// Hands single keys on as they are typed: all local modes of the terminal on standard input are off, and one key is
// enough for a read. Its settings come back at the end. Anything but a terminal is left as it is.
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

TCIMDateTime TOSSpecific::GetLocalTime() {
  TLocalTime const& now = TLocalClock().Now();
  std::tm const& fields = now.fFields;
  return TCIMDateTime(static_cast<unsigned short>(fields.tm_year + 1900), static_cast<unsigned short>(fields.tm_mon + 1),
                      static_cast<unsigned int>(fields.tm_mday), static_cast<unsigned short>(fields.tm_hour),
                      static_cast<unsigned short>(fields.tm_min), static_cast<unsigned short>(fields.tm_sec),
                      now.fMilliseconds * 1000, now.fUTCOffset);
}

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
  // Past stdio, which would take more than this one character out of IsKeyWaiting's sight.
  unsigned char character;
  return ::read(STDIN_FILENO, &character, 1) == 1 ? character : EOF;
}

int TOSSpecific::USleep(unsigned int milliseconds) {
  constexpr unsigned int kLongest = 4000000;  // what usleep can be told in microseconds
  for (; milliseconds > kLongest; milliseconds -= kLongest)
    if (int const result = ::usleep(kLongest * 1000); result != 0) return result;
  return ::usleep(milliseconds * 1000);
}

bool TOSSpecific::IsAdmin() { return ::getuid() == 0; }

int TOSSpecific::GetRunningTypeOnXen() {
  std::string const capabilities = "/proc/xen/capabilities";
  if (!FileExists(capabilities)) return 2;
  return CaptureFile(capabilities).find("control_d") != std::string::npos ? 0 : 1;
}

int TOSSpecific::LaunchCommandShell() { return std::system("sh"); }

void TOSSpecific::ExpandCommandLineWildcards(int argc, char** argv, int* newArgc, char*** newArgv) {
  *newArgc = argc;
  *newArgv = argv;
}

void TOSSpecific::setLuz(bool value) { isLuz = value; }

bool TOSSpecific::getLuz() { return isLuz; }

void TOSSpecific::setZEPParser(bool value) { isParser = value; }

bool TOSSpecific::isZEPParser() { return isParser; }

}  // namespace NQRVZEP20
