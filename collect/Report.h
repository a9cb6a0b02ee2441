// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/ECompleteness.h"
#include "collect/PlugIns.h"
#include "collect/Sample.h"
#include "collect/TAnswer.h"
#include "collect/findings/Findings.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace NQRVZEP20 {

struct TDate {
  unsigned fYear, fMonth, fDay;
};

// The processors of one kind.
struct TProcessorKind {
  std::string fKind;                    // such as "Example Processor"; empty when unknown
  std::size_t fCount;                   // the number of processors
  std::optional<std::uint64_t> fCores;  // the enabled cores of all of them; empty if the number is unknown for any of them
};

struct TMemorySize {
  std::uint64_t fBytes;         // the sum of the modules of known size; without modules, the memory that the kernel uses
  std::size_t fModules;         // the number of all modules; 0 if the firmware describes none
  std::size_t fUnknownModules;  // the number of modules of unknown size; less than fModules
};

// The value of a row: a string, or data that a front end formats itself. Processors are sorted by kind, with one entry per
// kind.
using TReportValue = std::variant<std::string, TDate, std::vector<TProcessorKind>, TMemorySize>;
using TReportAnswer = TAnswer<TReportValue>;

struct TReportRow {
  std::string fKey;    // a fixed identifier: "serialNumber"
  std::string fLabel;  // the text to display: "Serial number"
  TReportAnswer fAnswer;
};

// A report on this machine, or on the sample: rows with values or the reasons why they are missing. All values of the identity
// are strings.
//
// A report owns its rows; the views in fPlugIns share ownership of the namespaces. Several threads may read the rows; read the
// views from one thread at a time (TNamespaceView.h).
struct TReport {
  TFindings fFindings;  // these do not affect the completeness
  std::vector<TReportRow> fIdentity;
  std::vector<TReportRow> fDetails;  // these do not affect the completeness
  std::vector<TPlugIn> fPlugIns;
  std::optional<TSample> fSample;  // when the report is on a sample
  std::string fTableFile;          // the file named by ZEP_SMBIOS_TABLE; empty when there is none, and for a sample
  ECompleteness fCompleteness;
  std::string fRecorded = {};  // when the machine was recorded: "2026-11-23T04:05:06Z"; empty for a machine that is read now

  // The row of the identity or the details with that key, which the report owns; null if there is none.
  TReportRow const* FindRow(std::string const& key) const;
};

// The rules of a report. A front end may add its own to the standard ones.
struct TReportRules {
  TThresholds fThresholds = {};
  std::vector<TRule> fRules = StandardRules();
};

// Makes the report from the namespaces of the plug-ins. `sample` is the one that was passed to LoadPlugIns or LoadPlugInsApart,
// if any. Each value is taken from the first provider that has it. If a provider throws, the value is unknown, with the code
// provider-failed; its exceptions do not pass through. Without plug-ins every row is unknown. Blocks while it reads the
// namespaces.
TReport MakeReport(std::vector<TPlugIn> plugIns, std::optional<TSample> sample = std::nullopt, TReportRules const& rules = {});

}  // namespace NQRVZEP20
