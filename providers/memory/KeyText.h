// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMReference.h"

#include <string>

namespace NQRVZEP20 {

// The key bindings of a path as one string. Two paths of a class have the same string if they name the same instance. The order
// and the case of the key names do not matter. Values are compared by their text in an object path, reals with all significant
// digits; datetimes of the same instant in different time zones differ. NULL keys are omitted; without keys the string is
// empty.
std::string KeyText(TCIMReference const& path);

}  // namespace NQRVZEP20
