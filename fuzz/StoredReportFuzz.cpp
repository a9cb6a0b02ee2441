// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as a stored report. A text that is refused has a reason with the name of the file; one that is accepted, cut by
// one byte, is refused. A report that is accepted has a page and no difference from itself, and a problem that is solved in one
// direction of a comparison is new in the other.

#include "collect/SafeText.h"
#include "collect/stored/Differences.h"
#include "fuzz/Require.h"
#include "tools/zep/html/DifferencesHtml.h"
#include "tools/zep/html/ReportHtml.h"

#include <cstdint>
#include <string>

using namespace NQRVZEP20;

namespace {

void RequirePage(std::string const& page) { Require(page.rfind("<!DOCTYPE html>", 0) == 0 && WithBytesEscaped(page) == page); }

// Compares it with itself, and with itself without its first object and its problems.
void Compare(TStoredReport const& report) {
  Require(DifferencesOf(report, report).IsSame());
  TStoredReport less = report;
  less.fProblems.clear();
  if (!less.fInstances.empty()) less.fInstances.erase(less.fInstances.begin());
  TDifferences const differences = DifferencesOf(report, less), reverse = DifferencesOf(less, report);
  Require(differences.fSolvedProblems.size() == reverse.fNewProblems.size());
  RequirePage(zep::DifferencesAsHtml(differences, report, less));
}

bool IsAccepted(std::string const& text) {
  try {
    TStoredReport const report = StoredReportFrom(text, "a.json");
    for (TStoredInstance const& instance : report.fInstances)
      for (TStoredProperty const& property : instance.fProperties) Require(property.IsKnown() || property.fText.empty());
    RequirePage(zep::ReportAsHtml(report));
    Compare(report);
    return true;
  } catch (TStoredReportError const& failure) {
    Require(std::string(failure.what()).rfind("a.json: ", 0) == 0);
    return false;
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  if (IsAccepted(text) && text.back() == '}') Require(!IsAccepted(text.substr(0, size - 1)));
  return 0;
}
