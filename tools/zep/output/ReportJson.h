// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"
#include "tools/zep/output/Json.h"

#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20::zep {

// Whether passwords are hidden in messages (AsText in Json.h), or not, for a document that is sent or stored.
enum class EMessages { kWithoutSecrets, kVerbatim };

// A report as a document, with every instance of every namespace. Its exit status reflects the completeness of the report.
//
// The instances, which are most of it, are kept as text: as a tree they would take ten times the memory, and most of the time.
class TReportDocument {
public:
  TReportDocument(TReport const& report, EMessages messages);

  // A document without instances, about a report that was written elsewhere.
  explicit TReportDocument(TJson members) : fMembers(std::move(members)) {}

  // All members; in place of the instances, null. They may be changed and added to.
  TJson& Members() { return fMembers; }

  // The whole document, in the form of AsText.
  std::string Text() const;

private:
  void AddInstances(std::vector<TPlugIn> const& plugIns);

  EMessages fMessages = EMessages::kWithoutSecrets;
  TJson fMembers;
  std::string fInstances;  // the elements of the array, separated by commas
};

}  // namespace NQRVZEP20::zep
