// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "LongLong.h"
#include "TCIMValue.h"

#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {

// The name of a property and its value.
struct TMemoryEntry : std::pair<std::string, TCIMValue> {
  TMemoryEntry(std::pair<std::string, TCIMValue> entry) : pair(std::move(entry)) {}
  TMemoryEntry(std::string name, TCIMValue value) : pair(std::move(name), std::move(value)) {}
  template <class T, IfLongLong<T> = 0>
  TMemoryEntry(std::string name, T number) : TMemoryEntry(std::move(name), FromLongLong(number)) {}
};

// The property values of a new instance by name.
//
//   TMemoryValues values{{"Name", "sda"}, {"Removable", false}};
//   values.Set("SectorSize", 512);
//   ns->AddInstance("X_Disk", values);
//
// A number may have any integer type, whatever the declared type of the property is: AddInstance converts it, and refuses one
// that the declared type cannot hold. An instance gets the values in their order, so of two for the same property the later one
// remains. A plain value: a copy is deep.
class TMemoryValues : public std::vector<TMemoryEntry> {
public:
  using vector::vector;

  // Adds a value.
  void Set(std::string name, TCIMValue value) { emplace_back(std::move(name), std::move(value)); }
  template <class T, IfLongLong<T> = 0>
  void Set(std::string name, T number) {
    emplace_back(std::move(name), number);
  }
};

}  // namespace NQRVZEP20
