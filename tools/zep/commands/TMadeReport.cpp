// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/TMadeReport.h"

#include "tools/zep/output/StoredReportText.h"

namespace NQRVZEP20::zep {

TMadeReport::TMadeReport(TReport report, TRedactionArguments const& redaction) : fReport(std::move(report)) {
  if (!redaction.IsWanted()) return;
  TReportDocument document(fReport, EMessages::kVerbatim);
  document.ReadInstances();
  RedactDocument(document.Members(), redaction);
  fRedacted = std::move(document.Members());
}

TReportDocument TMadeReport::Document(EMessages messages) const {
  return fRedacted ? TReportDocument(*fRedacted, messages) : TReportDocument(fReport, messages);
}

std::string TMadeReport::Text(TReportParts const& parts) const {
  return fRedacted ? StoredReportAsText(Stored(), parts) : ReportAsText(fReport, parts);
}

TStoredReport TMadeReport::Stored() const { return StoredReportFrom(Document(EMessages::kWithoutSecrets).Text(), "this report"); }

}  // namespace NQRVZEP20::zep
