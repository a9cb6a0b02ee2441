// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/Report.h"
#include "tools/zep/output/Json.h"

#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20::zep {

// A report as a document, with every instance of every namespace. Its exit status reflects the completeness of the report.
//
// The instances, which are most of it, are converted one by one while the document is written: the memory that they take does not
// depend on their number.
class TReportDocument {
public:
  using TWriter = std::function<void(std::string const& text)>;

  // `report` is read while the document is written.
  TReportDocument(TReport const& report, EMessages messages);

  // A document that was made elsewhere: that of a redacted report, or one about a report that was written to a medium.
  explicit TReportDocument(TJson members, EMessages messages = EMessages::kWithoutSecrets)
      : fMessages(messages), fMembers(std::move(members)) {}

  // All members; in place of the instances, null before ReadInstances. They may be changed and added to.
  TJson& Members() { return fMembers; }
  TJson const& Members() const { return fMembers; }

  // Reads the instances now, so that they are members, too, and may be changed. The memory then depends on their number; throws
  // TFailure with kExitNothing if they are longer than kStoredReportLimit.
  void ReadInstances();

  // Calls `write` with one piece of the text after the other; the text has the form of AsText. What `write` throws is passed on.
  void Write(TWriter const& write) const;

  // The same as lines, for large machines: all members but the instances, each instance, and at the end the number of instances
  // and the failures: {"instances":402,"instanceFailures":[]}.
  void WriteLines(TWriter const& write) const;

  // The whole text. Throws TFailure with kExitNothing if it is longer than `most` bytes.
  std::string Text(std::size_t most = std::string::npos) const;

private:
  std::string TextOf(TJson json) const;
  std::string LineOf(TJson json) const;
  TJson WriteInstances(TWriter const& write) const;
  TJson ForEachInstance(int depth, TWriter const& use) const;

  EMessages fMessages = EMessages::kWithoutSecrets;
  TJson fMembers;
  std::vector<TPlugIn> const* fPlugIns = nullptr;
};

}  // namespace NQRVZEP20::zep
