// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"

#include <string>

namespace NQRVZEP20::zep {

// The report as text: the head lines, then tables of the identity, the details and the plug-ins.
std::string ReportAsText(TReport const& report);

}  // namespace NQRVZEP20::zep
