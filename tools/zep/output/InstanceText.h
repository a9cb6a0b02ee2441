// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/TNamespaceView.h"

#include <string>

namespace NQRVZEP20::zep {

// The first line about an object or a class, with the label of the sample, and an empty line.
std::string Heading(TNamespaceView const& view, std::string const& text);

// The path of the instance, and a table of its properties: name, type, and value or the reason why it is missing.
std::string InstanceAsText(TNamespaceView const& view, ICIMInstance const& instance);

}  // namespace NQRVZEP20::zep
