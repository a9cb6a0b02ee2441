// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/StoredReport.h"

#include <string>

namespace NQRVZEP20 {

// What differs between two reports of a machine with which nothing has happened.

// Whether the property, which both instances have with different values, changes by itself: times, free space, load and traffic
// (counters of errors do not), readings of sensors within their hysteresis, or within a tenth if they state none, and the start
// of the kernel within ten seconds, because corrections of the clock move it.
bool IsUsualChange(TStoredInstance const& before, TStoredInstance const& after, std::string const& property);

// The path by which an object is found in another report: that of the instance, except for the records of the kernel's log. Their
// key MessageTimestamp moves with the clock, so that they have their number and text.
std::string LastingPath(TStoredInstance const& instance);

}  // namespace NQRVZEP20
