// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>

namespace NQRVZEP20 {

// The limits of what one plug-in may answer. They keep the memory for any answer, and the time to read it and to look things up
// in it, in proportion to its bytes; an honest answer is far below them. The largest schemas have about 2,000 classes.

// ---- Of one piece ----

// Bytes of the name of a provider, a namespace, a class or any other element: a name is hashed and compared at each look-up.
constexpr std::size_t kLongestName = 1024;

// Bytes of an error or of a line of the log: they are shown in tables, and one may be recorded in place of every value. A longer
// text is cut.
constexpr std::size_t kLongestFailure = 1024;

// Elements of one kind: properties of a class or an instance, qualifiers of an element, parameters of a method. Qualifiers and
// parameters are searched one by one.
constexpr std::uint64_t kMostElements = 10'000;

// Superclasses one above the other: the search for a declaration follows them.
constexpr std::uint64_t kMostClassDepth = 100;

// Keys of a path: TCIMReference inserts each into a sorted list.
constexpr std::uint64_t kMostKeys = 256;

// References as keys of references: they are read recursively.
constexpr std::uint64_t kMostReferenceDepth = 100;

constexpr std::uint64_t kMostArrayElements = 1'000'000;  // reading an array makes an object for each

// ---- Of all namespaces of a plug-in together: each of these is an object, or work, for a few bytes of the answer ----

constexpr std::uint64_t kMostProviders = 1'000;  // each has a row in the report, and one looks for its row among them
constexpr std::uint64_t kMostClasses = 100'000;
constexpr std::uint64_t kMostElementsInAll = 2'000'000;
constexpr std::uint64_t kMostInstances = 2'000'000;
constexpr std::uint64_t kMostValues = 50'000'000;  // including array elements and keys

constexpr std::uint64_t kMostTraces = 100;  // descriptors, and processes, that a plug-in leaves: each is a line of a check
constexpr std::uint64_t kMostUndefinedSymbols = 1'000;  // each is a line of a check, too

// Bytes of the messages that are no namespaces: names, stages, times and failures.
constexpr std::uint64_t kMostOtherBytes = 16 * 1024 * 1024;

// How much of the limits above the namespaces of a plug-in have used.
struct TAnswerCounts {
  std::uint64_t fClasses = 0, fElements = 0, fInstances = 0, fValues = 0;
};

}  // namespace NQRVZEP20
