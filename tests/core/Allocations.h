#pragma once

namespace NQRVZEP20 {

// How often this program, its libraries included, has called operator new.
long CountedAllocations();

}  // namespace NQRVZEP20
