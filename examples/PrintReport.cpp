// SPDX-License-Identifier: Apache-2.0

// A front end in a few lines: loads the provider plug-ins, makes the report, and prints it in its own way.

#include "collect/PlugInsApart.h"
#include "collect/Report.h"
#include "collect/SafeText.h"

#include <iostream>

using namespace NQRVZEP20;

int main() {
  TReport const report = MakeReport(LoadPlugInsApart());
  for (TReportRow const& row : report.fIdentity) {
    bool const isKnown = row.fAnswer.IsKnown();
    std::string const text = isKnown ? std::get<std::string>(*row.fAnswer.fValue) : "? " + row.fAnswer.fMissing.fReason;
    std::cout << row.fLabel << ": " << Printable(text) << "\n";  // firmware and plug-ins may contain control characters
  }
  if (TReportAnswer const& memory = report.FindRow("memory")->fAnswer; memory.IsKnown())
    std::cout << "Memory: " << (std::get<TMemorySize>(*memory.fValue).fBytes >> 30) << " GiB\n";
  return report.fCompleteness == ECompleteness::kNothing ? 1 : 0;
}
