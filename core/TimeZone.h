#pragma once

#include <cstdlib>
#include <cstring>

namespace NQRVZEP20 {

// Watches the environment variable TZ, for those who must call tzset when it changes: localtime_r does not, and mktime does
// whenever it is called. One for each thread; without a destructor, so that it serves the thread to its very end.
class TTimeZone {
public:
  // Whether TZ is not as it was when this was asked before. True the first time, and always for a text that is too long to
  // be kept.
  bool HasChanged() {
    char const* const zone = std::getenv("TZ");
    if (IsKept(zone)) return false;
    Keep(zone);
    return true;
  }

private:
  bool IsKept(char const* zone) const {
    if (!fIsKept || fIsSet != (zone != nullptr)) return false;
    return !fIsSet || std::strcmp(fText, zone) == 0;
  }

  void Keep(char const* zone) {
    fIsSet = zone != nullptr;
    fIsKept = !fIsSet || std::strlen(zone) < sizeof fText;
    if (fIsSet && fIsKept) std::strcpy(fText, zone);
  }

  bool fIsKept = false;
  bool fIsSet = false;  // whether there is a TZ
  char fText[64] = {};  // of TZ
};

}  // namespace NQRVZEP20
