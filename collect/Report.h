// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/ECompleteness.h"
#include "collect/PlugIns.h"
#include "collect/Sample.h"
#include "collect/TAnswer.h"

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
  std::size_t fCount;                   // how many processors
  std::optional<std::uint64_t> fCores;  // the enabled cores of all of them; none when any of them has an unknown number
};

struct TMemorySize {
  std::uint64_t fBytes;         // of the modules of known size
  std::size_t fModules;         // all modules
  std::size_t fUnknownModules;  // those of them of unknown size; less than fModules
};

// The value of a row: a text, or data that a front end prints in its own way. Processors are sorted by kind, each kind once.
using TReportValue = std::variant<std::string, TDate, std::vector<TProcessorKind>, TMemorySize>;
using TReportAnswer = TAnswer<TReportValue>;

struct TReportRow {
  std::string fKey;    // for programs: "serialNumber"
  std::string fLabel;  // for people: "Serial number"
  TReportAnswer fAnswer;
};

// A report on the identity of this machine, or of the sample: rows with values or the reasons why they are missing. All values
// of the identity are texts.
//
// A value that owns its rows; the views in fPlugIns share the namespaces of the plug-ins, which stay loaded until the process
// ends. Several threads may read the rows; read the views from one thread at a time (TNamespaceView.h).
struct TReport {
  std::vector<TReportRow> fIdentity;
  std::vector<TReportRow> fDetails;  // they do not count for the completeness
  std::vector<TPlugIn> fPlugIns;
  std::optional<TSample> fSample;  // when the report is on a sample
  std::string fTableFile;          // the file named by ZEP_SMBIOS_TABLE; empty when there is none, and for a sample
  ECompleteness fCompleteness;

  // The row of that key, of the identity or the details; null when there is none. It belongs to the report.
  TReportRow const* FindRow(std::string const& key) const;
};

// Makes the report from the namespaces of the plug-ins (LoadPlugIns). `sample` is the one that was passed to LoadPlugIns, if
// any. The first provider that knows a value gives it. A provider that fails makes its answers unknown, with the code
// provider-failed; nothing that it throws is passed on. Without plug-ins every row is unknown. Blocks while providers answer.
TReport MakeReport(std::vector<TPlugIn> plugIns, std::optional<TSample> sample = std::nullopt);

}  // namespace NQRVZEP20
