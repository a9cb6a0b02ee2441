// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdlib>
#include <cstring>

namespace NQRVZEP20 {

// Watches the environment variable TZ for code that must call tzset when it changes: localtime_r does not call tzset, while
// mktime does on every call. Use one object per thread. It has no destructor, so it can be used until the very end of the
// thread.
class TTimeZone {
public:
  // Whether TZ has changed since the last call. True on the first call, and on every call while TZ is too long to be stored.
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
  bool fIsSet = false;  // whether TZ was set at the last call
  char fText[64] = {};  // the value of TZ at the last call
};

}  // namespace NQRVZEP20
