// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// Why a value is missing.
struct TMissing {
  std::string fCode;    // for programs: one of the codes below, or a provider's own
  std::string fReason;  // human-readable: a clause that begins in lower case and has no full stop
};

// Codes of providers.
constexpr char const* kMissingNoTables = "no-smbios";       // the system exports no SMBIOS tables
constexpr char const* kMissingNeedsRoot = "needs-root";     // only root may read the source
constexpr char const* kMissingUnreadable = "unreadable";    // the source cannot be read for another reason
constexpr char const* kMissingPlaceholder = "placeholder";  // the source contains a placeholder text instead of a value
constexpr char const* kMissingNotGiven = "not-given";       // the source omits the value or reports it as unknown
constexpr char const* kMissingNoSource = "no-source";       // a driver, counter, program or device that would show it is missing
constexpr char const* kMissingUnexpected = "unexpected-form";  // the source contains something that is not a valid value

// Codes of front ends.
constexpr char const* kMissingNotDescribed = "not-described";      // no provider has the class, or an instance of it
constexpr char const* kMissingProviderFailed = "provider-failed";  // the provider threw an exception
constexpr char const* kMissingNotApplicable = "not-applicable";    // this machine has no such value, and needs none

}  // namespace NQRVZEP20
