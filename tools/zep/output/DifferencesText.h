// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/Differences.h"
#include "tools/zep/output/Json.h"

#include <string>

namespace NQRVZEP20::zep {

// A line for each difference: "gone: CIM_PhysicalMemory DIMM 2 (16 GiB, Example Works)"; and a line for each provider whose
// objects were not compared.
std::string DifferencesAsText(TDifferences const& differences);

// "1 gone, 2 changed"; empty without differences.
std::string CountsOf(TDifferences const& differences);

// The same as a document of that name.
TJson DifferencesAsJson(std::string const& document, EExitStatus status, TDifferences const& differences,
                        TStoredReport const& before, TStoredReport const& after);

}  // namespace NQRVZEP20::zep
