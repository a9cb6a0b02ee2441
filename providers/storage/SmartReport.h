// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// An attribute of the SMART table of an ATA disk.
struct TSmartAttribute {
  unsigned short fId = 0;
  TFinding<std::string> fName = TMissing();
  TFinding<unsigned short> fValue = TMissing(), fWorst = TMissing(), fThreshold = TMissing();
  TFinding<unsigned long> fRaw = TMissing();
  TFinding<bool> fIsPrefailure = TMissing();
  TFinding<std::string> fRawText = TMissing();     // as smartctl interprets the raw value
  TFinding<std::string> fWhenFailed = TMissing();  // "now" or "past"
};

// The health of a disk as smartctl reports it in JSON. The names are those of ZEP_DiskHealth (ZEP_DiskHealth.mof).
struct TSmartReport {
  TFinding<bool> fPassed;
  TFinding<long> fTemperature;  // in degrees Celsius
  TFinding<unsigned long> fPowerOnHours, fPowerCycles;
  TFinding<unsigned long> fReallocated, fPending, fUncorrectable, fTransferErrors, fErrorLogEntries, fUnsafeShutdowns;
  TFinding<unsigned char> fPercentageUsed, fAvailableSpare, fAvailableSpareThreshold, fCriticalWarning;
  TFinding<unsigned long> fBytesRead, fBytesWritten;
  TFinding<std::string> fSelfTest;
  TFinding<unsigned> fRotationsPerMinute;  // 0 for a disk that does not rotate
  TFinding<unsigned> fFormFactor;          // the codes of VPD page B1
  std::vector<TSmartAttribute> fAttributes;
};

// Whether the report has any value about the health of the disk.
bool HasHealth(TSmartReport const& report);

// Whether the temperature is all that the disk complains about: an NVMe disk whose critical warning has bit 1 alone.
bool IsOnlyTemperature(TSmartReport const& report);

// A report whose values are all missing for that reason.
TSmartReport NoSmartReport(TMissing const& why);

// `text`: the output of smartctl --json -x. Anything else than an object in JSON, or one with errors only, is a report without
// values.
TSmartReport SmartReportFrom(std::string const& text);

}  // namespace NQRVZEP20
