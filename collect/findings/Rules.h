// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/findings/TRule.h"

#include <vector>

namespace NQRVZEP20 {

// The parts of StandardRules (Findings.h), by subject.
std::vector<TRule> StorageRules();
std::vector<TRule> FileSystemRules();
std::vector<TRule> NetworkRules();
std::vector<TRule> DeviceRules();
std::vector<TRule> SensorRules();
std::vector<TRule> LogRules();
std::vector<TRule> ManagementControllerRules();  // with EventLogRules
std::vector<TRule> EventLogRules();              // of the controller's event log
std::vector<TRule> HostRules();
std::vector<TRule> SystemRules();

// Problems that plug-ins report themselves, as instances of ZEP_Finding.
std::vector<TRule> PlugInRules();

}  // namespace NQRVZEP20
