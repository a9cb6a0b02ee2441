// SPDX-License-Identifier: Apache-2.0
#include "tests/core/Allocations.h"

#include "ZEPExport.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<long> gAllocations = 0;

}  // namespace

#ifdef ZEP_THREAD_SANITIZER

bool NQRVZEP20::CountsAllocations() { return false; }

#else

// The libraries use these operators instead of those of the C++ library.

ZEP_EXPORT void* operator new(std::size_t size) {
  ++gAllocations;
  if (void* const memory = std::malloc(size)) return memory;
  throw std::bad_alloc();
}

ZEP_EXPORT void operator delete(void* memory) noexcept { std::free(memory); }

ZEP_EXPORT void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }

bool NQRVZEP20::CountsAllocations() { return true; }

#endif

long NQRVZEP20::CountedAllocations() { return gAllocations; }
