// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

// Writes one entry to the system log, as the program "YBNQ". `priority`: such as LOG_ERR. Blocks while the system log does.
void WriteToSystemLog(int priority, char const* text);

}  // namespace NQRVZEP20
