#include "TOSSpecific.h"
#include "os/LocalTime.h"

namespace NQRVZEP20 {

TCIMDateTime TOSSpecific::GetLocalTime() {
  TLocalTime const& now = TLocalClock().Now();
  std::tm const& fields = now.fFields;
  return TCIMDateTime(static_cast<unsigned short>(fields.tm_year + 1900), static_cast<unsigned short>(fields.tm_mon + 1),
                      static_cast<unsigned int>(fields.tm_mday), static_cast<unsigned short>(fields.tm_hour),
                      static_cast<unsigned short>(fields.tm_min), static_cast<unsigned short>(fields.tm_sec),
                      now.fMilliseconds * 1000, now.fUTCOffset);
}

}  // namespace NQRVZEP20
