// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"

#include "os/LocalTime.h"

#include <unistd.h>

#include <cstdlib>

namespace NQRVZEP20 {

bool isLuz = false;
bool isParser = false;

TCIMDateTime TOSSpecific::GetLocalTime() {
  TCIMDateTime now;
  SetToLocalTime(now);
  return now;
}

int TOSSpecific::USleep(unsigned int milliseconds) {
  constexpr unsigned int kLongest = 4000000;  // in microseconds it still fits the argument of usleep
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
