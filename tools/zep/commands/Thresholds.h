// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/findings/TThresholds.h"

namespace NQRVZEP20::zep {

// The thresholds of the findings: the defaults, or the settings in zep.cfg of the working directory. Throws TWrongUsage for a
// setting that is out of range.
TThresholds ThresholdSettings();

}  // namespace NQRVZEP20::zep
