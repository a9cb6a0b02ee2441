// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/Differences.h"
#include "collect/stored/StoredReport.h"
#include "tools/zep/commands/Redacting.h"
#include "tools/zep/output/ExitStatus.h"

#include <string>

namespace NQRVZEP20::zep {

// Reads a stored report (ReadStoredReport). Throws TFailure with kExitNoInput if it is refused.
TStoredReport ReadReport(std::string const& file);

// Reads the document of a stored report, whose parts are complete, and redacts it if that is wanted (RedactDocument). Throws in
// the same way.
TJson ReadDocument(std::string const& file, TRedactionArguments const& redaction = {});

// The report of that document.
TStoredReport ReadReport(std::string const& file, TRedactionArguments const& redaction);

// The exit status of the report, which its document states: kExitComplete, kExitPartial or kExitNothing.
EExitStatus StatusOf(TStoredReport const& report);

// Writes the report as a page to `file`, or prints it as text if that is empty. Throws like WriteOutputFile.
void PrintOrWritePage(TStoredReport const& report, std::string const& file);

struct TDifferenceOutput {
  bool fAsJson = false;
  std::string fHtmlFile;  // empty: no page
};

// Prints the differences of two reports as text or as a document named `document`, or writes them as a page. Returns
// kExitComplete if there are none, kExitNothing if there are some, and kExitPartial if there are none but not everything could be
// compared. The output does not name the files of redacted reports. Throws TFailure with kExitNoInput if the reports are not
// redacted alike.
EExitStatus PrintDifferences(std::string const& document, TStoredReport before, TStoredReport after,
                             TDifferenceOutput const& output);

}  // namespace NQRVZEP20::zep
