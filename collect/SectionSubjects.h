// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <vector>

namespace NQRVZEP20 {

// Which class is the subject of each section of a report, and which properties are its columns.

// How the text of a cell is made.
enum class ECell {
  kProperty,
  kNumber,      // without its unit
  kDuration,    // seconds, as days, hours and minutes
  kSource,      // without the place that " on " leads to, which another column shows
  kMacAddress,  // hexadecimal digits, which are shown in pairs
  kIdentifier,  // the element of the array that has the description fOther
  kProduct,     // a size in bytes: the property times the property fOther
  kEither,      // the property fOther where the first has no value
  kDescribed    // the property fOther where the value of the first is named "Other"
};

struct TColumn {
  char const* fTitle;
  char const* fProperty;
  ECell fCell = ECell::kProperty;
  char const* fOther = nullptr;
};

// A section for the instances of a class and its subclasses.
struct TSubject {
  char const* fKey;
  char const* fTitle;
  char const* fClass;
  std::vector<TColumn> fColumns;
  bool fIsSorted = false;  // by the first column; otherwise in the order of the provider
};

// The array of identifiers in which kIdentifier finds its element.
constexpr char const* kIdentifiers = "OtherIdentifyingInfo";

// All of them, in the order of the report.
std::vector<TSubject> const& SectionSubjects();

}  // namespace NQRVZEP20
