// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

// Whether allocations are counted. False under the thread sanitizer, whose operator new cannot be replaced.
bool CountsAllocations();

// The number of calls of operator new in this program and its libraries.
long CountedAllocations();

}  // namespace NQRVZEP20
