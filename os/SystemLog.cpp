// SPDX-License-Identifier: Apache-2.0
#include "os/SystemLog.h"

#include <syslog.h>

namespace NQRVZEP20 {

void WriteToSystemLog(int priority, char const* text) {
  ::openlog("YBNQ", LOG_NDELAY, LOG_SYSLOG);
  ::syslog(priority, "%s", text);
  ::closelog();
}

}  // namespace NQRVZEP20
