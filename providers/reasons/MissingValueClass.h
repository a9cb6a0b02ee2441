// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

// The names under which a namespace records sources and reasons, for the writer and the reader.

// A qualifier of a property, of type string: the source of its values.
constexpr char const* kValueSource = "ValueSource";

// A class with one instance for each missing value. All properties are strings; the first two are the keys.
constexpr char const* kMissingValueClass = "ZEP_MissingValue";
constexpr char const* kElementPath = "ElementPath";          // the object path of the instance; for a class without one, its name
constexpr char const* kElementProperty = "ElementProperty";  // the property; empty for a class without an instance
constexpr char const* kMissingCode = "Code";                 // TMissing::fCode
constexpr char const* kMissingReason = "Reason";             // TMissing::fReason

}  // namespace NQRVZEP20
