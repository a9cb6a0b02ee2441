// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"
#include "collect/stored/StoredReport.h"
#include "tools/zep/commands/Redacting.h"
#include "tools/zep/output/ReportJson.h"
#include "tools/zep/output/ReportText.h"

#include <optional>
#include <string>

namespace NQRVZEP20::zep {

// A report on this machine in the forms in which it leaves zep. If it is redacted, so is each of them: they are made from the
// redacted document.
class TMadeReport {
public:
  // Redacts the report, and its log, if that is wanted (RedactDocument).
  TMadeReport(TReport report, TRedactionArguments const& redaction, std::string log = "");

  TReport const& Report() const { return fReport; }

  TReportDocument Document(EMessages messages) const;
  std::string Text(TReportParts const& parts) const;

  std::string const& Log() const { return fLog; }

  // The report as it would be read back from its document. Throws TFailure with kExitNothing if that is too long to be stored.
  TStoredReport Stored() const;

private:
  TReport fReport;
  std::string fLog;
  std::optional<TJson> fRedacted;
};

}  // namespace NQRVZEP20::zep
