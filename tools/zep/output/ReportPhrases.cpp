// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/ReportPhrases.h"

#include "collect/ProductName.h"
#include "tools/zep/output/Text.h"

#include <algorithm>
#include <cstdio>
#include <numeric>

namespace NQRVZEP20::zep {

namespace {

// ---- Values ----

std::string Counted(std::uint64_t count, std::string const& noun) {
  return std::to_string(count) + " " + noun + (count == 1 ? "" : "s");
}

std::string InWords(std::string const& text) { return text; }

std::string InWords(TDate const& date) {
  char text[40];
  std::snprintf(text, sizeof text, "%04u-%02u-%02u", date.fYear, date.fMonth, date.fDay);
  return text;
}

std::string NameOf(TProcessorKind const& kind) { return kind.fKind.empty() ? "processor of unknown kind" : kind.fKind; }

std::string InWords(std::vector<TProcessorKind> kinds) {
  std::sort(kinds.begin(), kinds.end(), [](auto const& one, auto const& other) { return NameOf(one) < NameOf(other); });
  std::vector<std::string> phrases;
  for (TProcessorKind const& kind : kinds) phrases.push_back(std::to_string(kind.fCount) + " x " + NameOf(kind));
  if (std::all_of(kinds.begin(), kinds.end(), [](TProcessorKind const& kind) { return kind.fCores.has_value(); }))
    phrases.push_back(Counted(std::accumulate(kinds.begin(), kinds.end(), std::uint64_t{0},
                                              [](std::uint64_t sum, TProcessorKind const& kind) { return sum + *kind.fCores; }),
                              "core"));
  return Joined(phrases, ", ");
}

std::string InWords(TMemorySize const& size) {
  if (size.fModules == 0) return SizeText(size.fBytes) + ", as the kernel uses it";
  std::string const text = ExactSizeText(size.fBytes) + " in " + Counted(size.fModules, "module");
  return size.fUnknownModules == 0 ? text : text + ", " + std::to_string(size.fUnknownModules) + " of them of unknown size";
}

// ---- Head lines ----

TReportAnswer AnswerOf(TReport const& report, std::string const& key) {
  TReportRow const* const row = report.FindRow(key);
  return row != nullptr ? row->fAnswer : TReportAnswer();
}

std::string ValueOr(TReportAnswer const& answer, std::string const& otherwise) {
  return answer.IsKnown() ? ValueText(*answer.fValue) : otherwise;
}

std::string TypeAndModel(TReport const& report) {
  TReportAnswer const type = AnswerOf(report, "machineType"), model = AnswerOf(report, "model");
  if (type.IsNotApplicable()) return "no machine type and model";
  return "type " + ValueOr(type, "unknown") + (model.IsNotApplicable() ? ", no model" : ", model " + ValueOr(model, "unknown"));
}

std::string MachineLine(TReport const& report) {
  TReportAnswer const product = AnswerOf(report, "productName"), type = AnswerOf(report, "machineType"),
                      serial = AnswerOf(report, "serialNumber");
  std::string const host = ValueOr(AnswerOf(report, "hostName"), "Unnamed machine");
  bool const isAnyKnown = product.IsKnown() || type.IsKnown() || serial.IsKnown();
  if (!isAnyKnown && product.fMissing.fReason == serial.fMissing.fReason)
    return host + ": not identified: " + product.fMissing.fReason;
  return host + ": " + (product.IsKnown() ? WithoutBrackets(ValueText(*product.fValue)) : "unknown product") + ", " +
         TypeAndModel(report) + ", serial number " + ValueOr(serial, "unknown");
}

std::string OperatingSystemLine(TReport const& report) {
  TReportAnswer const name = AnswerOf(report, "osName"), version = AnswerOf(report, "osVersion"),
                      type = AnswerOf(report, "osType"), kernel = AnswerOf(report, "kernel");
  std::string line = report.fSample ? "operating system of this machine, not of the sample: " : "Operating system: ";
  line += ValueOr(name, "unknown: " + name.fMissing.fReason);
  if (name.IsKnown() && version.IsKnown()) line += " " + ValueText(*version.fValue);
  if (type.IsKnown() && kernel.IsKnown()) line += ", " + ValueText(*type.fValue) + " " + ValueText(*kernel.fValue);
  return line;
}

// ---- Reasons ----

// "Serial number: needs root"; rows in a row with the same reason share it: "Model, Serial number: needs root".
std::vector<std::string> MissingRows(std::vector<TReportRow> const& rows) {
  std::vector<std::string> phrases;
  std::string last;  // the reason of the row before
  for (TReportRow const& row : rows) {
    TReportAnswer const& answer = row.fAnswer;
    if (answer.IsKnown() || answer.IsNotApplicable()) continue;
    if (!phrases.empty() && answer.fMissing.fReason == last)
      phrases.back().insert(phrases.back().size() - last.size() - 2, ", " + row.fLabel);
    else
      phrases.push_back(row.fLabel + ": " + answer.fMissing.fReason);
    last = answer.fMissing.fReason;
  }
  return phrases;
}

}  // namespace

std::string ValueText(TReportValue const& value) {
  return std::visit([](auto const& data) { return InWords(data); }, value);
}

std::vector<std::string> HeadLines(TReport const& report) {
  std::string const label = LabelPrefixOf(report);
  return {label + MachineLine(report), label + OperatingSystemLine(report)};
}

std::string WhyNotComplete(TReport const& report) {
  if (report.fCompleteness == ECompleteness::kComplete) return "";
  std::vector<std::string> reasons = MissingRows(report.fIdentity);
  for (std::string const& failure : FailuresOf(report.fPlugIns)) reasons.push_back(failure);
  return Joined(reasons, "; ");
}

std::string SampleLabelOf(TReport const& report) { return report.fSample ? report.fSample->fLabel : ""; }

std::string LabelPrefixOf(TReport const& report) { return report.fSample ? report.fSample->fLabel + " " : ""; }

}  // namespace NQRVZEP20::zep
