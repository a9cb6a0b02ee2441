// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/TMadeReport.h"

#include "tools/zep/output/StoredReportText.h"

namespace NQRVZEP20::zep {

namespace {

// The member of the document that has the log while it is redacted: as a message (Redaction.h), and with the secrets of the
// report.
constexpr char const* kLog = "words";

}  // namespace

TMadeReport::TMadeReport(TReport report, TRedactionArguments const& redaction, std::string log)
    : fReport(std::move(report)), fLog(std::move(log)) {
  if (!redaction.IsWanted()) return;
  TReportDocument document(fReport, EMessages::kVerbatim);
  document.ReadInstances();
  document.Members()[kLog] = std::move(fLog);
  RedactDocument(document.Members(), redaction);
  fLog = document.Members()[kLog].get<std::string>();
  document.Members().erase(kLog);
  fRedacted = std::move(document.Members());
}

TReportDocument TMadeReport::Document(EMessages messages) const {
  return fRedacted ? TReportDocument(*fRedacted, messages) : TReportDocument(fReport, messages);
}

std::string TMadeReport::Text(TReportParts const& parts) const {
  return fRedacted ? StoredReportAsText(Stored(), parts) : ReportAsText(fReport, parts);
}

TStoredReport TMadeReport::Stored() const {
  return StoredReportFrom(Document(EMessages::kWithoutSecrets).Text(kStoredReportLimit), "this report");
}

}  // namespace NQRVZEP20::zep
