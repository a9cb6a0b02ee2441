// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>

namespace NQRVZEP20 {

class ICIMPropertyDecl;

// The unit of a property: the value of its qualifier PUnit; empty without one.
std::string UnitOf(ICIMPropertyDecl const& property);

// A number with its unit as a person writes it: "1.5 GiB", "10 Gbit/s", "2300 MHz", "7200 rpm". `unit`: the value of the
// qualifier PUnit, such as "byte", "bit / second", "hertz * 10^6"; a unit that is not known here is printed as it is, and without
// a unit the number is printed alone. A value that is not a number is printed like ToString.
std::string TextWithUnit(TCIMValue const& value, std::string const& unit);

}  // namespace NQRVZEP20
