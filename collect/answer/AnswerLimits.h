// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace NQRVZEP20 {

// The limits for one serialised namespace (NamespaceBytes.h). They bound the memory for a received namespace and the time to
// read it, with ample room for real ones: the largest schemas have about 2,000 classes.
constexpr std::uint64_t kMostClasses = 100'000;
constexpr std::uint64_t kMostClassDepth = 1'000;  // the length of a chain of superclasses
constexpr std::uint64_t kMostElements = 100'000;  // each: properties of a class, qualifiers of an element, keys of a path
constexpr std::uint64_t kMostElementsInAll = 2'000'000;
constexpr std::uint64_t kMostArrayElements = 1'000'000;
constexpr std::uint64_t kMostReferenceDepth = 100;  // the nesting of references as keys of references
constexpr std::uint64_t kMostInstances = 2'000'000;
constexpr std::uint64_t kMostValues = 50'000'000;  // including array elements and keys

}  // namespace NQRVZEP20
