// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Sections.h"

#include <string>

namespace NQRVZEP20::zep {

// The section as a table below its title, or its title and the reason why it has no rows. `label`: the label of the sample and a
// blank; empty without a sample. At most `limit` rows are printed, and then the number of the others; 0 is no limit.
std::string SectionAsText(TReportSection const& section, std::string const& label, std::size_t limit);

}  // namespace NQRVZEP20::zep
