// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"

#include <map>
#include <string>

namespace NQRVZEP20 {

// The open descriptors of this process, with their targets: "/etc/hostname", "pipe:[123]". Empty without /proc.
std::map<int, std::string> OpenDescriptors();

// The traces that the plug-in in this process has left: the descriptors that are open and were not open `before`; the children
// of this process; and those of its parent, which is the supervisor (Supervisor.h), except this process. At most kMostTraces of
// each kind.
TTraces TracesSince(std::map<int, std::string> const& before);

}  // namespace NQRVZEP20
