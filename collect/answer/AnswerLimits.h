// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace NQRVZEP20 {

// The limits of one namespace as bytes (NamespaceBytes.h). They keep the memory for an answer, and the time to read it, in
// proportion to an honest one; the largest schemas have about 2,000 classes.
constexpr std::uint64_t kMostClasses = 100'000;
constexpr std::uint64_t kMostClassDepth = 1'000;  // of superclasses one above the other
constexpr std::uint64_t kMostElements = 100'000;  // of one kind: properties of a class, qualifiers of an element, keys of a path
constexpr std::uint64_t kMostElementsInAll = 2'000'000;
constexpr std::uint64_t kMostArrayElements = 1'000'000;
constexpr std::uint64_t kMostReferenceDepth = 100;  // of references as keys of references
constexpr std::uint64_t kMostInstances = 2'000'000;
constexpr std::uint64_t kMostValues = 50'000'000;  // elements of arrays and keys included

}  // namespace NQRVZEP20
