// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The wording of a report, for text and JSON alike.

// A value as readable text: "2 x Example Processor, 24 cores", "128 GiB in 8 modules", "2024-03-09".
std::string ValueText(TReportValue const& value);

// Two lines: the machine, and its operating system.
std::vector<std::string> HeadLines(TReport const& report);

// The missing values and the failed plug-ins, with their reasons; empty if the report is complete.
std::string WhyNotComplete(TReport const& report);

// The label of the report's sample, such as "SAMPLE"; empty without a sample.
std::string SampleLabelOf(TReport const& report);

// The same with a blank after it.
std::string LabelPrefixOf(TReport const& report);

}  // namespace NQRVZEP20::zep
