// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Missing.h"
#include "collect/Sections.h"
#include "collect/TAnswer.h"

#include <cstddef>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// Why a stored report is refused, with the file and the place: "a.json: line 3, column 9: ..." or
// "a.json: /instances/4/class: is not a string".
struct TStoredReportError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

struct TStoredProperty {
  std::string fName;
  std::string fType;  // "uint64", "string[]"
  bool fIsKey;
  std::string fRaw;   // the value as in the document, for comparison: "17179869184"; empty if it is missing
  std::string fText;  // for people, with the unit or the names of the values: "16 GiB"; empty if it is missing
  std::string fUnit;  // as in the qualifier PUnit; empty without one
  std::string fSource;
  TMissing fMissing;  // why the value is missing; only then

  bool IsKnown() const { return fMissing.fCode.empty(); }
};

struct TStoredInstance {
  std::string fPath, fProvider, fNamespace, fClass;
  std::vector<TStoredProperty> fProperties;

  // The property of that name, which the instance owns; null if there is none.
  TStoredProperty const* Find(std::string const& name) const;

  // Whether it only relates other instances: it has keys, and all of them are references.
  bool IsAssociation() const;
};

struct TStoredRow {
  std::string fKey, fLabel;
  TAnswer<std::string> fAnswer;
};

struct TStoredProblem {
  std::string fRule, fSeverity, fReason, fRemedy, fInstance;  // remedy and instance may be empty
};

struct TStoredNotExamined {
  std::string fInstance;  // empty: all of a kind
  std::string fReason;
};

struct TStoredRule {
  std::string fId, fQuestion, fOutcome;  // "fine", "wrong" or "not-asked"
  bool fHasNothingToExamine;             // the outcome is "fine", and no value was examined
  std::vector<TStoredNotExamined> fNotExamined;
};

struct TStoredProvider {
  std::string fPlugIn, fName, fNamespace;
  double fMilliseconds;
  std::string fError;  // empty if it filled its namespace, and all its instances could be read
};

// A document of `zep report --json` that was read back. A plain value.
struct TStoredReport {
  std::string fFile;       // its name
  std::string fZep;        // the version of the program that wrote it
  std::string fLabel;      // of the sample; empty without a sample
  std::string fTime;       // "2026-11-23T04:05:06Z"; empty if the document does not have it
  std::string fStatus;     // "complete", "partial" or "nothing"
  std::string fReason;     // why it is not complete; otherwise empty
  std::string fRedaction;  // the map and the kinds of the member "redaction": the same pseudonym stands for the same
                           // secret in reports where they are the same; empty if the report is not redacted
  std::vector<std::string> fHead;
  std::vector<TStoredProblem> fProblems;
  std::vector<TStoredRule> fRules;
  std::vector<TStoredRow> fIdentity, fDetails;
  std::vector<TReportSection> fSections;    // none if the document does not have them
  std::vector<TStoredProvider> fProviders;  // a plug-in that failed has one without a name
  std::vector<TStoredInstance> fInstances;
};

// The longest document that is read, in bytes. Reading takes about ten times its memory.
constexpr std::size_t kStoredReportLimit = 64 << 20;

// Reads a document from its bytes; `name` is the name for messages. Throws TStoredReportError if the text is not the complete
// document of a report, in a version that this library reads; nothing is used then.
TStoredReport StoredReportFrom(std::string const& text, std::string const& name);

// The same from a regular file, of which no more than kStoredReportLimit is read. A file that cannot be read is refused, too.
TStoredReport ReadStoredReport(std::string const& file);

}  // namespace NQRVZEP20
