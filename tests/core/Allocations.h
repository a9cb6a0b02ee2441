#pragma once

namespace NQRVZEP20 {

// Not under the thread sanitizer, which has an operator new of its own that cannot be replaced.
bool CountsAllocations();

// How often this program, its libraries included, has called operator new.
long CountedAllocations();

}  // namespace NQRVZEP20
