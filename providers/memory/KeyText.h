// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMReference.h"

#include <string>

namespace NQRVZEP20 {

// The key bindings of a path as one text. Two paths of a class have the same text if they name the same instance. The order and
// the case of the names do not matter. Values are compared by their text in an object path, reals with every digit; datetimes of
// the same instant in two time zones differ. NULL keys are omitted; without any key the text is empty.
std::string KeyText(TCIMReference const& path);

}  // namespace NQRVZEP20
