// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "KernelLog.h"
#include "providers/reasons/RunningClock.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// The log of the kernel, and a record of it. `clock`: of the machine when the log was read.
TRecord KernelLogRecord(TKernelLog const& log);
TRecord KernelEventRecord(TKernelEvent const& event, TRunningClock const& clock);

}  // namespace NQRVZEP20
