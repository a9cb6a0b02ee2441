// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <cstdint>
#include <string>

namespace NQRVZEP20 {

// An instance of CIM_Memory or a subclass of it: the main memory, a part of it, or a cache.
// `superClass`: for a class of our own.
TRecord ExtentRecord(char const* className, char const* source, TSystemName const& name, std::string const& id,
                     std::string const& elementName, TFinding<std::uint64_t> const& bytes, char const* superClass = "");

}  // namespace NQRVZEP20
