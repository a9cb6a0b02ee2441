// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The parts of the report that are not sections of collect/Sections.h.
constexpr char const* kFindingsPart = "findings";
constexpr char const* kIdentityPart = "identity";
constexpr char const* kDetailsPart = "details";
constexpr char const* kPlugInsPart = "plug-ins";

// The parts of the report to print.
struct TReportParts {
  std::vector<std::string> fSections;  // keys (SectionNames); empty for all
  bool fAllInstances = false;          // also every instance with all its properties
};

// The names of all sections: the findings, the identity, the details, those of collect/Sections.h and the plug-ins.
std::vector<std::string> SectionNames();

// The report as text: the head lines and the findings, then a table for each section. Of a section with many rows, only the first
// are printed, unless the parts name it.
std::string ReportAsText(TReport const& report, TReportParts const& parts = {});

}  // namespace NQRVZEP20::zep
