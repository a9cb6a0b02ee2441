// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Link.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// EnabledState, OperationalStatus and StatusDescriptions of a port or an interface, with the names of their values.
void AddState(TRecord& record, TLink const& link);

// The kernel's word for the operational state: "up", "lowerlayerdown", ….
TFinding<std::string> OperationalWordOf(TLink const& link);

// The flags in the kernel's words: "UP", "LOWER_UP", "PROMISC", ….
TFinding<std::vector<std::string>> FlagWordsOf(TLink const& link);

}  // namespace NQRVZEP20
