// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The log of a report, an entry on each line: the important entries of the library's log with their local times, which plug-ins
// write to, too; why plug-ins failed; and what they printed. Passwords are hidden (MessageWithoutSecrets), and every line is
// printable. Entries at debug severity, which may have the contents of files, are not in it.
std::string CollectorLog(std::vector<TPlugIn> const& plugIns);

}  // namespace NQRVZEP20::zep
